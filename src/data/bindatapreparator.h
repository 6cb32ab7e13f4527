#ifndef MCOBNQRT_BINDATAPREPARATOR_H
#define MCOBNQRT_BINDATAPREPARATOR_H

#include "data/binrecordbuffer.h"
#include "platform/platform.h"

#include <mcobnqrt/ibinvariable.h>
#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/mcstatus.h>

#include <cstdint>
#include <iosfwd>
#include <limits>
#include <string>
#include <vector>

class BINCancelMonitor;
class BINVarList;
class IBINEncoder;
class IBINRecordSource;
class IBINUserMissing;
class ProgressListener;

/// Stands between the variable list and the temporary files: works out how the host's variables map onto the fields of
/// a processed record, reads the host's records once, and spools them to one temporary file per field.
///
/// A processed record is laid out as target, weight, attributes in list order; target and weight only where the list
/// has one. A field's place in it is its position, which is not the variable's index in the list.
///
/// The layout is in bindatapreparator.cpp, the files in recordfiles.cpp, the pass over the records in datapass.cpp.
class BINDataPreparator
{
public:
    /// What is known of a temporary file beside its name.
    struct SpoolFile
    {
        bool fIsMade = false; ///< we made it; before that, whatever bears the name is somebody else's
        FileIdentity fIdentity;
        std::uint64_t fNumValues = 0; ///< elements written
    };

    /// Fixes the layout; does no input or output. All that is pointed to outlives the object; the listener may be null.
    /// `nSkippedCasesReports` is the number of records between two reports of the pass, 0 for no report.
    /// `maxNumRecords` is the number of records that can be accepted.
    BINDataPreparator(BINVarList* varList, BINCancelMonitor* cancelMonitor, std::string tempDirName,
                      ProgressListener* listener, int nSkippedCasesReports, Platform* platform = SystemPlatform(),
                      unsigned int maxNumRecords = std::numeric_limits<unsigned int>::max());
    BINDataPreparator(const BINDataPreparator&) = delete;
    BINDataPreparator& operator=(const BINDataPreparator&) = delete;
    /// Removes the temporary files. Whoever reads them has closed them by then.
    ~BINDataPreparator();

    /// Reads the source to its end, spools its records, and finds out which positions can be used. Called once.
    ///
    /// \return OK, or the error after which there are no data: BINStatusNoRecords when no record was accepted,
    ///         BINStatusCancelled, BINStatusTooManyCategories for the only categorical variable,
    ///         BINStatusInvalidVarList when some variable has no position, BINStatusOutOfMemory for more records than
    ///         can be accepted, or what InitTempFiles() or FlushBuffer() gave.
    MCBinning::MCStatus PrepareData(IBINRecordSource* source);

    /// Turns one record of the host into a processed one, and keeps the largest codes and the usable positions up to
    /// date. A record to be dropped raises fSkipRecord and is no failure.
    ///
    /// \return OK, or BINStatusTooManyCategories: an error if the list's target has a code that doesn't fit and there
    ///         is nothing else to bin against, else a warning.
    MCBinning::MCStatus ProcessRecord(const MCCommon::Record& input, MCCommon::Record& processed);

    /// Sizes the buffer and picks a free name for each position's file. No file comes into being here.
    MCBinning::MCStatus InitTempFiles();

    /// Writes the rows of the buffer behind what their files hold, makes the files where this is the first time, and
    /// empties the buffer, whatever the result. Every position gets a file, also one without a value.
    MCBinning::MCStatus FlushBuffer();

    /// Sets `*usable` to whether the position can be binned or binned against. BINStatusIndexOutOfRange for a position
    /// that there is not; `*usable` stays as it was.
    MCBinning::MCStatus IsVariableUsable(int position, bool* usable) const;

    /// Whether the position dropped out in the pass, so that its file holds fewer elements than there are records.
    bool IsCutShort(int position) const;

    MCBinning::MCStatus GetStatus() const { return fStatus; }
    BINVarList* GetVarList() const { return fVarList; }
    const std::vector<std::string>& GetFileNames() const { return fFileNames; }
    const std::vector<SpoolFile>& GetSpoolFiles() const { return fSpoolFiles; }
    const std::vector<int>& GetVariableIndex() const { return fVariableIndex; }
    const std::vector<int>& GetMaxCodes() const { return fMaxCodes; }
    unsigned int GetNumRecords() const { return fNumRecords; }
    Platform* GetPlatform() const { return fPlatform; }

    /// Dumps layout, status and variable list for a programmer's eye.
    void Display(std::ostream& out) const;

private:
    friend class BINDataPreparatorPeer; // the unit tests' way in

    int PlaceVariable(int variable);

    bool InitBuffer();
    MCBinning::MCStatus PickFileName(std::size_t position);
    NameState ProbeNextName(std::string& candidate);
    bool FlushRow(std::size_t position);
    std::FILE* MakeFile(std::size_t position);
    void RemoveTempFiles();

    MCBinning::MCStatus ReadSource(IBINRecordSource* source);
    MCBinning::MCStatus SpoolRecord(const MCCommon::Record& processed);
    void ExcludeUndeclaredCategories();
    MCBinning::MCStatus ProcessTarget(double code, MCCommon::Record& processed);
    double ProcessContinuous(int variable, double value) const;
    bool ProcessCategory(double code, int position, MCCommon::Record& processed);
    bool StoreCode(double code, int position, MCCommon::Record& processed);

    std::string fTempDirName;
    ProgressListener* fProgressListener; ///< not owned; null: no reports
    int fNSkippedCasesReports;
    std::vector<int> fVariableIndex; ///< by variable index: its position, -1 if it has none
    std::vector<int> fInputIndices;  ///< variable index of each attribute, in the order of their positions
    int fTargetIndex = -1;           ///< variable index of the target, -1 without one
    int fWeightIndex = -1;           ///< variable index of the weight, -1 without one
    int fWeightNewIndex = -1;        ///< above 0 with a weight; its position is in fVariableIndex
    std::vector<IBINVariable::MeasureLevel> fMeasureLevels; ///< by variable index
    std::vector<IBINVariable::VariableRole> fRoles;         ///< by variable index
    std::vector<const IBINUserMissing*> fUserMissingInfo;   ///< by variable index; not owned, null without one
    BINVarList* fVarList;                                   ///< the algorithm's; not owned
    std::vector<int> fMaxCodes;                             ///< by position: largest code seen
    std::vector<bool> fUsable;                              ///< by position: it still takes part
    MCBinning::MCStatus fStatus;
    bool fSkipRecord = false; ///< the record at hand is dropped
    unsigned int fOrigRecSize;
    unsigned int fProcRecSize;
    unsigned int fInputRecSize;
    BINCancelMonitor* fCancelMonitor;            ///< the algorithm's; not owned
    const IBINEncoder* fWeightEncoder = nullptr; ///< the weight variable's; not owned
    std::vector<std::string> fFileNames;         ///< by position
    BINRecordBuffer fBuffer;
    int fBufferSize = 10000; ///< values held per position before a flush
    unsigned int fNumRecords = 0;
    unsigned int fMaxNumRecords;
    int fHasWeight;
    int fHasTarget;
    Platform* fPlatform;
    std::int64_t fNextTick = 0;         ///< number of the next candidate name
    std::vector<SpoolFile> fSpoolFiles; ///< by position
};

#endif
