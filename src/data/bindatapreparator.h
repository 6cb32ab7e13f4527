#ifndef MCOBNQRT_BINDATAPREPARATOR_H
#define MCOBNQRT_BINDATAPREPARATOR_H

#include "data/datapass.h"
#include "data/recordfiles.h"
#include "metadata/recordlayout.h"
#include "platform/platform.h"

#include <mcobnqrt/mccommon.h>
#include <mcobnqrt/mcstatus.h>

#include <iosfwd>
#include <limits>
#include <string>
#include <vector>

class BINCancelMonitor;
class BINVarList;
class IBINRecordSource;
class ProgressListener;

/// Stands between the variable list and the temporary files: works out how the host's variables map onto the fields of
/// a processed record, reads the host's records once, and spools them to one temporary file per field.
///
/// It puts together the layout of a processed record (RecordLayout), the temporary files (RecordFiles) and the pass
/// over the records (DataPass).
class BINDataPreparator
{
public:
    /// Fixes the layout; does no input or output. All that is pointed to outlives the object; the listener may be null.
    /// `numSkippedCasesReports` is the number of records between two reports of the pass, 0 for no report.
    /// `maxNumRecords` is the number of records that can be accepted.
    BINDataPreparator(BINVarList* varList, BINCancelMonitor* cancelMonitor, const std::string& tempDirName,
                      ProgressListener* listener, int numSkippedCasesReports, Platform* platform = SystemPlatform(),
                      unsigned int maxNumRecords = std::numeric_limits<unsigned int>::max());
    BINDataPreparator(const BINDataPreparator&) = delete;
    BINDataPreparator& operator=(const BINDataPreparator&) = delete;
    // The temporary files go with the object. Whoever reads them has closed them by then.

    /// Reads the source to its end, spools its records, and finds out which positions can be used. Called once.
    ///
    /// \return OK, or the error after which there are no data: BINStatusNoRecords when no record was accepted,
    ///         BINStatusCancelled, BINStatusTooManyCategories for the only categorical variable,
    ///         BINStatusInvalidVarList when some variable has no position, BINStatusOutOfMemory for more records than
    ///         can be accepted, or what InitTempFiles() or FlushBuffer() gave.
    MCBinning::MCStatus PrepareData(IBINRecordSource* source);

    /// Turns one record of the host into a processed one, and keeps the largest codes and the usable positions up to
    /// date. A record to be dropped is no failure.
    ///
    /// \return OK, or BINStatusTooManyCategories: an error if the list's target has a code that doesn't fit and there
    ///         is nothing else to bin against, else a warning.
    MCBinning::MCStatus ProcessRecord(const MCCommon::Record& input, MCCommon::Record& processed);

    /// Picks a name for each position's file, as RecordFiles::Init. BINStatusInvalidVarList if a variable has no
    /// position.
    MCBinning::MCStatus InitTempFiles();

    /// As RecordFiles::Flush.
    MCBinning::MCStatus FlushBuffer() { return fFiles.Flush(); }

    /// Sets `*usable` to whether the position can be binned or binned against. BINStatusIndexOutOfRange for a position
    /// that doesn't exist; `*usable` stays as it was.
    MCBinning::MCStatus IsVariableUsable(int position, bool* usable) const;

    /// Whether the position dropped out in the pass, so that its file holds fewer elements than there are records.
    bool IsCutShort(int position) const;

    MCBinning::MCStatus GetStatus() const { return fStatus; }
    BINVarList* GetVarList() const { return fVarList; }
    const std::vector<std::string>& GetFileNames() const { return fFiles.GetNames(); }
    const std::vector<SpoolFile>& GetSpoolFiles() const { return fFiles.GetSpoolFiles(); }
    const RecordLayout& GetLayout() const { return fLayout; }
    const std::vector<int>& GetVariableIndex() const { return fLayout.GetPositions(); }
    const std::vector<int>& GetMaxCodes() const { return fPass.GetMaxCodes(); }
    unsigned int GetNumRecords() const { return fPass.GetNumRecords(); }
    Platform* GetPlatform() const { return fPlatform; }

    /// Dumps layout, status and variable list for a programmer's eye.
    void Display(std::ostream& out) const;

private:
    ProgressListener* fProgressListener; ///< not owned; null: no reports
    int fNSkippedCasesReports;
    BINVarList* fVarList;             ///< the algorithm's; not owned
    BINCancelMonitor* fCancelMonitor; ///< the algorithm's; not owned
    Platform* fPlatform;
    RecordLayout fLayout;
    RecordFiles fFiles;
    DataPass fPass;
    MCBinning::MCStatus fStatus;
};

#endif
