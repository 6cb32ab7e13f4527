#include "binning/binalgorithm.h"

#include "binning/attributereports.h"
#include "binning/binefpreprocess.h"

using MCBinning::MCStatus;
using MCMV::gMissingValue;

BINAlgorithm::BINAlgorithm(const BINSettings& settings, const BINVarList& varList, Platform* platform)
    : BinningDriver(settings, varList, platform), fTargetIndex(fVarList.GetTargetIndex())
{
}

BINAlgorithm::~BINAlgorithm() = default;

MCStatus BINAlgorithm::Run(IBINRecordSource* source, const std::vector<int>* attributes,
                           const std::vector<int>* targets)
{
    // Unsigned: the -1 that nobody has replaced is a threshold that no attribute passes.
    const auto threshold = static_cast<unsigned int>(fSettings.GetNumDistinctValueThreshold());
    fNumberOfBins = fSettings.GetNumberOfBins();
    if (fNumberOfBins <= 0)
        return MakeError(MCBinning::BINStatusBadNumberOfBins);
    const bool hasLists = attributes != nullptr || targets != nullptr;
    if (hasLists && !CheckAttributeTargetPairs(attributes, targets))
        return MakeError(MCBinning::BINStatusNoValidPairs);
    if (fCancelMonitor.IsCancelled())
        return CloseRun(MCStatus());

    const MCStatus status = PrepareOnce(source, TupleKind::kWithTarget, threshold);
    if (status.IsError())
        return status;
    return CloseRun(BinAllAttributes(attributes, targets));
}

/// Gives each entry its verdict. \return whether some entry can be binned.
bool BINAlgorithm::CheckAttributeTargetPairs(const std::vector<int>* attributes, const std::vector<int>* targets)
{
    if (attributes == nullptr || (targets != nullptr && attributes->size() != targets->size()))
        return false;
    fPairStatus.clear();
    for (std::size_t entry = 0; entry < attributes->size(); ++entry)
    {
        const int attribute = (*attributes)[entry];
        fPairStatus.push_back(targets != nullptr ? CheckPair(attribute, (*targets)[entry]) : CheckAttribute(attribute));
    }
    return IsAnyOK(fPairStatus);
}

MCStatus BINAlgorithm::CheckPair(int attribute, int target) const
{
    if (!HasVariable(attribute) || !HasVariable(target))
        return MakeError(MCBinning::BINStatusIndexOutOfRange);
    const IBINVariable::MeasureLevel level = fVarList.GetVarAt(target)->GetMeasureLevel();
    if (level != IBINVariable::MeasureNumericCategorical && level != IBINVariable::MeasureStringCategorical)
        return MakeError(MCBinning::BINStatusTargetNotCategorical);
    if (target == attribute || target == fWeightIndex || attribute == fWeightIndex)
        return MakeError(MCBinning::BINStatusRoleConflict);
    return MCStatus();
}

MCStatus BINAlgorithm::CheckAttribute(int attribute) const
{
    if (!HasVariable(attribute))
        return MakeError(MCBinning::BINStatusBadAttributeIndex);
    const bool hasOtherRole = attribute == fWeightIndex || attribute == fTargetIndex;
    return hasOtherRole ? MakeError(MCBinning::BINStatusRoleConflict) : MCStatus();
}

/// \return the status of the pair treated last, or BINStatusTargetUnusable if there was nothing to treat.
MCStatus BINAlgorithm::BinAllAttributes(const std::vector<int>* attributes, const std::vector<int>* targets)
{
    BINEFPreProcess preProcess(fNumberOfBins, fRightBorderClosed);
    const Lend lend(fPreProcess, preProcess);
    AttributeReports reports(fSettings, fPlatform);
    MCStatus status;
    const auto treat = [&](int attribute, int target)
    {
        status = BinAttributeTargetPair(attribute, target);
        reports.CountAttribute(attribute, status);
    };

    if (attributes == nullptr)
    {
        bool isUsable = false;
        if (fAttributeReader->IsVariableUsable(fTargetIndex, &isUsable).IsError() || !isUsable)
            return MakeError(MCBinning::BINStatusTargetUnusable);
        for (int attribute = 0; attribute < GetNumVariables(); ++attribute)
        {
            if (attribute != fTargetIndex && attribute != fWeightIndex)
                treat(attribute, fTargetIndex);
        }
        return status;
    }
    const std::vector<MCStatus> verdicts = fPairStatus; // a copy: a callback of the host may run the object again
    for (std::size_t entry = 0; entry < attributes->size(); ++entry)
    {
        const int attribute = (*attributes)[entry];
        const int target = targets != nullptr ? (*targets)[entry] : fTargetIndex;
        if (verdicts[entry].IsOK())
            treat(attribute, target);
        else
        {
            PairResult refused;
            refused.fStatus = verdicts[entry];
            Store(refused, attribute, target);
        }
    }
    return status;
}

MCStatus BINAlgorithm::BinAttributeTargetPair(int attribute, int target)
{
    if (fCancelMonitor.IsCancelled())
        return CloseStep(MCStatus());
    const PairResult result = BinCurrentPair(attribute, target);
    Store(result, attribute, target);
    return CloseStep(result.fStatus);
}

/// Loads a pair and bins it. Of the warnings the last one found stands: a target with one category hides all others.
BINAlgorithm::PairResult BINAlgorithm::BinCurrentPair(int attribute, int target)
{
    PairResult result;
    result.fMinimum = result.fMaximum = result.fModelEntropy = gMissingValue;
    result.fStatus = fAttributeReader->GetAttributeTargetData(attribute, target, &fTuples);
    if (result.fStatus.IsError())
        return result;

    const BINAttributeReader& reader = *fAttributeReader;
    result.fNumDistinct = reader.GetNumDistinct();
    result.fTotalWeight = reader.GetTotalWeight();
    result.fTotalWeightWithMissing = reader.GetTotalWeightWithMissing();
    result.fMinimum = reader.GetMinValue();
    result.fMaximum = reader.GetMaxValue();
    fRecordCount = reader.GetNumTuples();
    if (fRecordCount == 0)
    {
        result.fStatus = MakeWarning(MCBinning::BINStatusNoValidValues);
        return result;
    }
    fNumTargetCategories = reader.GetNumTargetCats();
    BinTuples(result);
    if (result.fNumDistinct == 1)
        result.fStatus = AboutIndex(MakeWarning(MCBinning::BINStatusSingleValueAttribute), attribute);
    if (fNumTargetCategories == 1)
        result.fStatus = AboutIndex(MakeWarning(MCBinning::BINStatusSingleCategoryTarget), target);
    return result;
}

void BINAlgorithm::BinTuples(PairResult& result)
{
    if (!fAttributeReader->IsPreBinningEngaged())
    {
        result.fStatus = BinAttributeDirect(fTuples, result.fCutPoints, result.fCells, result.fModelEntropy);
        return;
    }
    std::vector<double> cuts;
    if (fPreProcess->PreBinEqualFrequency(fTuples, fRecordCount, cuts, result.fTotalWeight))
        result.fStatus = BinAttributePreBinned(fTuples, cuts, result.fCutPoints, result.fCells, result.fModelEntropy);
}

/// Where the store refuses the indices, the pair leaves no trace.
void BINAlgorithm::Store(const PairResult& result, int attribute, int target)
{
    fOutput.SetAttributeTargetResults(result.fStatus, result.fCutPoints, result.fCells, attribute, target,
                                      result.fNumDistinct, result.fTotalWeight, result.fTotalWeightWithMissing,
                                      result.fMinimum, result.fMaximum, result.fModelEntropy);
}

void BINAlgorithm::Display(std::ostream& os)
{
    DisplayAs("BINAlgorithm", os);
}
