#include "data/bindatapreparator.h"

#include "base/bincancelmonitor.h"
#include "base/makestatus.h"
#include "data/passreports.h"

#include <mcobnqrt/binvarlist.h>

#include <ostream>

using MCBinning::MCStatus;

BINDataPreparator::BINDataPreparator(BINVarList* varList, BINCancelMonitor* cancelMonitor,
                                     const std::string& tempDirName, ProgressListener* listener,
                                     int numSkippedCasesReports, Platform* platform, unsigned int maxNumRecords)
    : fProgressListener(listener), fNSkippedCasesReports(numSkippedCasesReports), fVarList(varList),
      fCancelMonitor(cancelMonitor), fPlatform(platform), fLayout(*varList),
      fFiles(tempDirName, cancelMonitor, platform), fPass(*varList, fLayout, maxNumRecords)
{
}

MCStatus BINDataPreparator::PrepareData(IBINRecordSource* source)
{
    fStatus = InitTempFiles();
    if (!fStatus.IsOK())
        return fStatus;
    PassReports reports(fProgressListener, fNSkippedCasesReports, fPlatform);
    const MCStatus status = fPass.Read(*source, fFiles, *fCancelMonitor, reports);
    if (status.IsError())
        return status;

    if (fPass.GetNumRecords() == 0)
        fStatus = MakeError(MCBinning::BINStatusNoRecords);
    else if (fCancelMonitor->IsCancelled())
        fStatus = MakeError(MCBinning::BINStatusCancelled);
    else
        fPass.ExcludeUndeclaredCategories();
    return fStatus;
}

MCStatus BINDataPreparator::ProcessRecord(const MCCommon::Record& input, MCCommon::Record& processed)
{
    return fPass.ProcessRecord(input, processed);
}

MCStatus BINDataPreparator::InitTempFiles()
{
    // Everything behind this point rests on one position for each variable, and so for each field of a host record.
    if (FindVariableWithoutPosition(*fVarList) >= 0)
        return MakeError(MCBinning::BINStatusInvalidVarList);
    return fFiles.Init(fLayout.GetNumPositions());
}

MCStatus BINDataPreparator::IsVariableUsable(int position, bool* usable) const
{
    if (position < 0 || position >= fLayout.GetNumVariables())
        return MakeError(MCBinning::BINStatusIndexOutOfRange);
    *usable = fPass.GetUsable()[static_cast<std::size_t>(position)];
    return MCStatus();
}

bool BINDataPreparator::IsCutShort(int position) const
{
    return GetSpoolFiles()[static_cast<std::size_t>(position)].fNumValues < GetNumRecords();
}

void BINDataPreparator::Display(std::ostream& out) const
{
    out << "BINDataPreparator object: " << std::endl;
    out << "\tPossible inputs used? ";
    fLayout.Display(out);
    out << std::endl;
    if (fStatus.IsOK())
        out << "\tStatus is OK.\n";
    else
        out << "\tStatus has error code " << fStatus.GetErrorCode() << std::endl;
    fVarList->Display(out);
}
