#ifndef MCOBNQRT_EFBINOUTPUT_H
#define MCOBNQRT_EFBINOUTPUT_H

#include <mcobnqrt/binattributeresults.h>
#include <mcobnqrt/export.h>
#include <mcobnqrt/mcstatus.h>

#include <iosfwd>
#include <map>
#include <vector>

/// The results of an equal-frequency algorithm. The algorithm adds an entry for each attribute that it treats; the host
/// reads them when Run has returned. Entries are never removed or replaced: binning an attribute again adds a second
/// one.
///
/// What a getter hands over is the host's own copy. An operation that throws, for want of memory, has changed neither
/// the store nor what it was to fill.
class MCOBNQRT_EXPORT EFBINOutput
{
public:
    EFBINOutput();
    EFBINOutput(const EFBINOutput& other);
    EFBINOutput& operator=(const EFBINOutput& other);
    virtual ~EFBINOutput();

    /// Adds the entry of one attribute, with both lists as they are; what `status` says about the attribute makes no
    /// difference to the operation.
    ///
    /// \return OK, or the error BINStatusBadAttributeIndex, and nothing is added, if `attribute` is negative.
    MCBinning::MCStatus SetAttributeResults(MCBinning::MCStatus status, const std::vector<double>& cutPoints,
                                            const std::vector<double>& cellCounts, int attribute,
                                            unsigned int numDistinctValues, double totalWeight,
                                            double totalWeightWithMissing, double minimum, double maximum);

    /// Copies the first entry of the attribute to `results`.
    ///
    /// \return the status of that entry, or the error BINStatusIndexOutOfRange, and `results` is as before, if there is
    ///         none.
    MCBinning::MCStatus GetAttributeCutPoints(int attribute, BINAttributeResults& results) const;

    /// Replaces `results` by all entries, in the order in which they came.
    ///
    /// \return OK, whatever the entries' own statuses are, or the error BINStatusNoResults, and `results` is as before,
    ///         if the store is empty.
    MCBinning::MCStatus GetAllCutPoints(std::vector<BINAttributeResults>& results) const;

    /// Dumps all entries for a programmer's eye.
    virtual void Display(std::ostream& os) const;

private:
    std::vector<BINAttributeResults> fResults; ///< in the order of storing
    std::map<int, int> fResultIndex;           ///< by attribute: the index in fResults of its first entry
};

#endif
