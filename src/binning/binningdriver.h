#ifndef MCOBNQRT_BINNINGDRIVER_H
#define MCOBNQRT_BINNINGDRIVER_H

#include "base/bincancelmonitor.h"
#include "base/makestatus.h"
#include "base/version.h"
#include "data/binattributereader.h"
#include "data/bindatapreparator.h"
#include "platform/platform.h"

#include <mcobnqrt/binvarlist.h>
#include <mcobnqrt/ibinrecordsource.h>
#include <mcobnqrt/mcstatus.h>

#include <algorithm>
#include <memory>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

/// Holds what the two drivers share: the copies that they work on, the one preparation of the data, and how statuses
/// travel from an attribute to the end of a run. `Interface` is the abstract class that the host knows.
///
/// Wherever the host is called, it may call Run of the same object again. So what one call of Run works on is in its
/// local variables, and a member that a call changes is not read by it behind a call into the host.
template<class Interface, class Settings, class Output>
class BinningDriver : public Interface
{
public:
    BinningDriver(const BinningDriver&) = delete;
    BinningDriver& operator=(const BinningDriver&) = delete;

    std::string GetVersionString() override { return GetComponentVersion(); }
    void SetCancelPointer(MCQueryCancel* query) override { fCancelMonitor.SetCancelPointer(query); }
    void Cancel() override { fCancelMonitor.Cancel(); }
    void SetProgressListener(ProgressListener* listener) override { fSettings.SetProgressListener(listener); }
    Output* GetOutput() override { return &fOutput; }

    MCBinning::MCStatus GetStatus() override
    {
        NoteCancel(fStatus);
        return fStatus;
    }

    Settings* GetSettings() override { return &fSettings; }

    /// The algorithm's own copy of the variable list. No variable of it is to be removed or replaced during a Run.
    virtual BINVarList* GetVarList() { return &fVarList; }

protected:
    BinningDriver(const Settings& settings, const BINVarList& varList, Platform* platform)
        : fSettings(settings), fVarList(varList), fCancelMonitor(settings.GetCancelPointer()),
          fWeightIndex(fVarList.GetWeightIndex()), fPlatform(platform)
    {
    }

    /// Reads and spools the records in the first call that finds one, and gives the outcome of that again in later
    /// calls. `threshold` is the number of distinct values above which an attribute is pre-binned, 0 for none.
    MCBinning::MCStatus PrepareOnce(IBINRecordSource* source, TupleKind kind, unsigned int threshold)
    {
        if (fDataPreparator != nullptr)
            return fPreparationStatus;
        const bool hasRecord = source != nullptr && source->HasNext();
        // A source that runs the object from its HasNext() has the data prepared by that inner call.
        if (fDataPreparator != nullptr)
            return fPreparationStatus;
        if (!hasRecord)
            return MakeError(MCBinning::BINStatusNoRecords);
        auto preparator = std::make_unique<BINDataPreparator>(&fVarList, &fCancelMonitor, fSettings.GetTempDirName(),
                                                              fSettings.GetProgressListener(),
                                                              fSettings.GetNSkippedCasesReports(), fPlatform);
        auto reader = std::make_unique<BINAttributeReader>(source, preparator.get(), kind);
        reader->SetNumDistinctValueThreshold(threshold);
        fDataPreparator = std::move(preparator);
        fAttributeReader = std::move(reader);
        fRightBorderClosed = fSettings.IsRightBorderClosed();

        // There is no record for an inner call of Run until all are read, and none at all after an exception of the
        // host.
        fPreparationStatus = MakeError(MCBinning::BINStatusNoRecords);
        fPreparationStatus = fAttributeReader->ReadRecords();
        return fPreparationStatus;
    }

    /// Ends the work on one attribute or pair: a status of it that is not OK becomes the algorithm's.
    MCBinning::MCStatus CloseStep(MCBinning::MCStatus status)
    {
        if (!status.IsOK())
            fStatus = status;
        NoteCancel(status);
        return status;
    }

    /// Ends a run that wasn't stopped before its first attribute. \return the status of the run.
    MCBinning::MCStatus CloseRun(MCBinning::MCStatus status)
    {
        if (!fStatus.IsOK())
            status = MakeWarning(MCBinning::BINStatusSomeResultsFlagged);
        NoteCancel(status);
        return status;
    }

    template<class Entry>
    static bool IsAnyOK(const std::vector<Entry>& entries)
    {
        return std::any_of(entries.begin(), entries.end(), [](const Entry& entry) { return entry.fVerdict.IsOK(); });
    }

    bool HasVariable(int index) const { return index >= 0 && index < GetNumVariables(); }
    int GetNumVariables() const { return static_cast<int>(fVarList.Size()); }

    void DisplayAs(const char* className, std::ostream& os) const
    {
        os << std::endl << "Start of " << className << " display" << std::endl;
        os << "Record count: " << fRecordCount << std::endl;
        os << "out result: ";
        if (fDataPreparator != nullptr)
            fDataPreparator->Display(os);
        fOutput.Display(os);
        os << "End of " << className << " display" << std::endl;
    }

private:
    /// A cancel replaces a status and the algorithm's with it.
    void NoteCancel(MCBinning::MCStatus& status)
    {
        if (fCancelMonitor.IsCancelled())
            fStatus = status = MakeError(MCBinning::BINStatusCancelled);
    }

protected:
    unsigned int fRecordCount = 0;  ///< tuples of the attribute or pair treated last
    bool fRightBorderClosed = true; ///< the setting when the records were read, so that all results have one side
    Settings fSettings;
    BINVarList fVarList;
    MCBinning::MCStatus fStatus; ///< the last of an attribute or pair that was not OK, or cancelled; never OK again
    BINCancelMonitor fCancelMonitor;
    MCBinning::MCStatus fPreparationStatus; ///< of the one reading of the source
    // In this order: the reader closes its files before the preparator removes them.
    std::unique_ptr<BINDataPreparator> fDataPreparator;
    std::unique_ptr<BINAttributeReader> fAttributeReader;
    int fWeightIndex;
    Output fOutput;
    Platform* fPlatform;
};

#endif
