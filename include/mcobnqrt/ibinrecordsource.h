#ifndef MCOBNQRT_IBINRECORDSOURCE_H
#define MCOBNQRT_IBINRECORDSOURCE_H

#include <mcobnqrt/export.h>

namespace MCCommon
{
class Record;
}

/// Implemented by a host: the stream of its records. It is handed to Run, stays the host's, and is read to its end by
/// the first Run that finds a record. Later calls don't touch it.
///
/// A record has one field for each variable of the BINVarList, field i for the variable at index i:
///
///     variable                          field
///     continuous                        the value
///     numeric or string categorical     the code that the variable's encoder gave: 0, 1, 2, ... up to 255;
///                                       -1.0 if the value is missing
///     frequency weight                  the weight as it is in the data; rounding is done by the library
///
/// In each of them MCMV::gMissingValue stands for no value, and so do a field that the record doesn't have and, in a
/// continuous field, a NaN. Infinities are values. Of a code the whole part counts. One that is not from 0 to 255 takes
/// its variable out of the analysis, and the variable's results say so; one that is not below the declared number of
/// categories does that where the variable is the target of a result. The field of the list's target is read as a code
/// even if that role was given to a continuous variable. User-missing values of a continuous variable and of the weight
/// are given as they are: the library knows them from the list. A record whose weight is missing or not above 0 counts
/// nowhere.
class MCOBNQRT_EXPORT IBINRecordSource
{
public:
    virtual ~IBINRecordSource() = default;

    /// Whether Next() has another record. Consumes nothing: it is asked twice ahead of the first record, once by the
    /// test whether there are any, and then once ahead of each further one and at the end.
    virtual bool HasNext() = 0;

    /// The next record, which stays the source's and is only read, until the next call of either operation. Null if
    /// there is nothing to work on this time; it is not the end, and HasNext() is asked again.
    virtual const MCCommon::Record* Next() = 0;
};

#endif
