#ifndef MCOBNQRT_DATAPASS_H
#define MCOBNQRT_DATAPASS_H

#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/mcstatus.h>

#include <vector>

class BINCancelMonitor;
class BINVarList;
class IBINRecordSource;
class IBINUserMissing;
class BINRoundEncoder;
class PassReports;
class RecordFiles;
class RecordLayout;

/// The one pass over the host's records: decides which records count, what counts as missing, and which positions stay
/// usable.
///
/// Only a missing weight drops a record. All other missing data stay in the files as gMissingValue, since a record
/// without one attribute is good for the others.
class DataPass
{
public:
    /// List and layout, which is the list's, outlive the object. `maxNumRecords` is the number of records that can be
    /// accepted.
    DataPass(const BINVarList& list, const RecordLayout& layout, unsigned int maxNumRecords);

    /// Reads the source to its end or to a cancel, and spools its records. The files have been initialised.
    ///
    /// \return OK, or the error that stopped the pass: that of ProcessRecord() or RecordFiles::Flush(), or
    ///         BINStatusOutOfMemory for more records than can be accepted.
    MCBinning::MCStatus Read(IBINRecordSource& source, RecordFiles& files, BINCancelMonitor& cancelMonitor,
                             PassReports& reports);

    /// As BINDataPreparator::ProcessRecord. IsRecordDropped() tells whether the record is to be dropped.
    MCBinning::MCStatus ProcessRecord(const MCCommon::Record& input, MCCommon::Record& processed);
    bool IsRecordDropped() const { return fSkipRecord; }

    /// Makes each categorical variable unusable that has a code at or beyond its declared number of categories, though
    /// its file is complete.
    void ExcludeUndeclaredCategories();

    unsigned int GetNumRecords() const { return fNumRecords; }        ///< accepted so far
    const std::vector<int>& GetMaxCodes() const { return fMaxCodes; } ///< by position: largest code so far
    const std::vector<bool>& GetUsable() const { return fUsable; }    ///< by position: it still takes part

private:
    MCBinning::MCStatus SpoolRecord(const MCCommon::Record& processed, RecordFiles& files);
    MCBinning::MCStatus ProcessTarget(double code, MCCommon::Record& processed);
    double ProcessContinuous(int variable, double value) const;
    bool ProcessCategory(double code, int position, MCCommon::Record& processed);
    bool StoreCode(double code, int position, MCCommon::Record& processed);

    const BINVarList& fVarList;
    const RecordLayout& fLayout;
    std::vector<const IBINUserMissing*> fUserMissingInfo; ///< by variable index; not owned, null without one
    const BINRoundEncoder* fWeightEncoder = nullptr;      ///< the weight variable's; not owned
    std::vector<int> fMaxCodes;
    std::vector<bool> fUsable;
    bool fSkipRecord = false; ///< the record at hand is dropped
    unsigned int fNumRecords = 0;
    unsigned int fMaxNumRecords;
};

#endif
