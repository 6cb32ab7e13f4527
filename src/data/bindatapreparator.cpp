#include "data/bindatapreparator.h"

#include "base/makestatus.h"

#include <mcobnqrt/binvarlist.h>
#include <mcobnqrt/ibinencoder.h>

#include <ostream>
#include <utility>

using MCBinning::MCStatus;

namespace
{

template<class Numbers>
void DisplayNumbers(std::ostream& out, const char* label, const Numbers& numbers)
{
    out << label;
    for (const auto number : numbers) out << static_cast<int>(number) << ' ';
    out << std::endl;
}

} // namespace

BINDataPreparator::BINDataPreparator(BINVarList* varList, BINCancelMonitor* cancelMonitor, std::string tempDirName,
                                     ProgressListener* listener, int nSkippedCasesReports, Platform* platform,
                                     unsigned int maxNumRecords)
    : fTempDirName(std::move(tempDirName)), fProgressListener(listener), fNSkippedCasesReports(nSkippedCasesReports),
      fVarList(varList), fMaxCodes(varList->Size(), 0), fUsable(varList->Size(), true), fOrigRecSize(varList->Size()),
      fInputRecSize(static_cast<unsigned int>(varList->GetNumAttributeVars())), fCancelMonitor(cancelMonitor),
      fMaxNumRecords(maxNumRecords), fHasWeight(varList->GetWeightIndex() >= 0 ? 1 : 0),
      fHasTarget(varList->GetTargetIndex() >= 0 ? 1 : 0), fPlatform(platform)
{
    fProcRecSize = fInputRecSize + static_cast<unsigned int>(fHasTarget + fHasWeight);
    fVariableIndex.reserve(fOrigRecSize);
    fInputIndices.reserve(fInputRecSize);
    fMeasureLevels.reserve(fOrigRecSize);
    fRoles.reserve(fOrigRecSize);
    fUserMissingInfo.reserve(fOrigRecSize);
    for (int variable = 0; variable < static_cast<int>(fOrigRecSize); ++variable)
    {
        fUserMissingInfo.push_back(fVarList->GetVarAt(variable)->GetUserMissingInfo());
        fMeasureLevels.push_back(fVarList->GetVarAt(variable)->GetMeasureLevel());
        fRoles.push_back(fVarList->GetVariableRole(variable));
        fVariableIndex.push_back(PlaceVariable(variable));
    }
}

/// Notes what the role of the variable says of it. \return its position, -1 if it has none.
int BINDataPreparator::PlaceVariable(int variable)
{
    switch (fRoles.back())
    {
    case IBINVariable::RoleAttribute:
        fInputIndices.push_back(variable);
        return fHasTarget + fHasWeight + static_cast<int>(fInputIndices.size()) - 1;
    case IBINVariable::RoleTarget:
        fTargetIndex = variable;
        return 0;
    case IBINVariable::RoleFrequencyWeight:
        fWeightIndex = variable;
        fWeightNewIndex = 1;
        fWeightEncoder = fVarList->GetEncoderAt(variable);
        return fHasTarget;
    default:
        return -1;
    }
}

BINDataPreparator::~BINDataPreparator()
{
    RemoveTempFiles();
}

MCStatus BINDataPreparator::IsVariableUsable(int position, bool* usable) const
{
    if (position < 0 || position >= static_cast<int>(fOrigRecSize))
        return MakeError(MCBinning::BINStatusIndexOutOfRange);
    *usable = fUsable[static_cast<std::size_t>(position)];
    return MCStatus();
}

bool BINDataPreparator::IsCutShort(int position) const
{
    return fSpoolFiles[static_cast<std::size_t>(position)].fNumValues < fNumRecords;
}

void BINDataPreparator::Display(std::ostream& out) const
{
    out << "BINDataPreparator object: " << std::endl;
    out << "\tPossible inputs used? ";
    out << "\tOriginal record size = " << fOrigRecSize << std::endl;
    out << "\tProcessed record size = " << fProcRecSize << std::endl;
    out << "\tInput-only record size = " << fInputRecSize << std::endl;
    out << "\tFrequency weight original and new indices: " << fWeightIndex << "   " << fWeightNewIndex << std::endl;
    DisplayNumbers(out, "\tVariable index: ", fVariableIndex);
    DisplayNumbers(out, "\tIndices of input variables in the variable list: ", fInputIndices);
    DisplayNumbers(out, "\tVariable measurement levels: ", fMeasureLevels);
    DisplayNumbers(out, "\tVariable roles: ", fRoles);
    out << std::endl;
    if (fStatus.IsOK())
        out << "\tStatus is OK.\n";
    else
        out << "\tStatus has error code " << fStatus.GetErrorCode() << std::endl;
    fVarList->Display(out);
}
