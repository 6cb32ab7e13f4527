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
    const int numberOfBins = fSettings.GetNumberOfBins();
    if (numberOfBins <= 0)
        return MakeError(MCBinning::BINStatusBadNumberOfBins);
    const bool hasLists = attributes != nullptr || targets != nullptr;
    const std::vector<Entry> entries = hasLists ? CheckAttributeTargetPairs(attributes, targets) : ListAll();
    if (hasLists && !IsAnyOK(entries))
        return MakeError(MCBinning::BINStatusNoValidPairs);
    if (fCancelMonitor.IsCancelled())
        return CloseRun(MCStatus());

    const MCStatus status = PrepareOnce(source, TupleKind::kWithTarget, threshold);
    if (status.IsError())
        return status;
    if (!hasLists && !IsListTargetUsable())
        return CloseRun(MakeError(MCBinning::BINStatusTargetUnusable));
    return CloseRun(BinAllEntries(entries, numberOfBins));
}

/// Every attribute against the list's target, if it has one.
std::vector<BINAlgorithm::Entry> BINAlgorithm::ListAll() const
{
    std::vector<Entry> entries;
    for (int attribute = 0; attribute < GetNumVariables(); ++attribute)
    {
        if (attribute != fTargetIndex && attribute != fWeightIndex)
            entries.push_back({attribute, fTargetIndex, MCStatus()});
    }
    return entries;
}

/// Gives each entry of the host's lists its verdict. Empty for lists that don't belong together.
std::vector<BINAlgorithm::Entry> BINAlgorithm::CheckAttributeTargetPairs(const std::vector<int>* attributes,
                                                                         const std::vector<int>* targets) const
{
    if (attributes == nullptr || (targets != nullptr && attributes->size() != targets->size()))
        return {};
    std::vector<Entry> entries;
    entries.reserve(attributes->size());
    for (std::size_t i = 0; i < attributes->size(); ++i)
    {
        const int attribute = (*attributes)[i];
        if (targets != nullptr)
            entries.push_back({attribute, (*targets)[i], CheckPair(attribute, (*targets)[i])});
        else
            entries.push_back({attribute, fTargetIndex, CheckAttribute(attribute)});
    }
    return entries;
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

bool BINAlgorithm::IsListTargetUsable() const
{
    bool isUsable = false;
    return !fAttributeReader->IsVariableUsable(fTargetIndex, &isUsable).IsError() && isUsable;
}

/// \return the status of the pair treated last.
MCStatus BINAlgorithm::BinAllEntries(const std::vector<Entry>& entries, int numberOfBins)
{
    const BINEFPreProcess preProcess(numberOfBins, fRightBorderClosed);
    AttributeReports reports(fSettings, fPlatform);
    MCStatus status;
    for (const Entry& entry : entries)
    {
        if (entry.fVerdict.IsOK())
        {
            status = BinAttributeTargetPair(entry.fAttribute, entry.fTarget, preProcess);
            reports.CountAttribute(entry.fAttribute, status);
        }
        else
        {
            PairResult refused;
            refused.fStatus = entry.fVerdict;
            Store(refused, entry.fAttribute, entry.fTarget);
        }
    }
    return status;
}

MCStatus BINAlgorithm::BinAttributeTargetPair(int attribute, int target, const BINEFPreProcess& preProcess)
{
    if (fCancelMonitor.IsCancelled())
        return CloseStep(MCStatus());
    const PairResult result = BinPair(attribute, target, preProcess);
    Store(result, attribute, target);
    return CloseStep(result.fStatus);
}

/// Loads a pair and bins it. Of the warnings the last one found stands: a target with one category hides all others.
BINAlgorithm::PairResult BINAlgorithm::BinPair(int attribute, int target, const BINEFPreProcess& preProcess)
{
    PairResult result;
    result.fMinimum = result.fMaximum = result.fModelEntropy = gMissingValue;
    std::vector<BINSortTuple>* tuples = nullptr; // the reader's
    result.fStatus = fAttributeReader->GetAttributeTargetData(attribute, target, &tuples);
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
    BinTuples(tuples, preProcess, result);
    if (result.fNumDistinct == 1)
        result.fStatus = AboutIndex(MakeWarning(MCBinning::BINStatusSingleValueAttribute), attribute);
    if (fNumTargetCategories == 1)
        result.fStatus = AboutIndex(MakeWarning(MCBinning::BINStatusSingleCategoryTarget), target);
    return result;
}

void BINAlgorithm::BinTuples(const std::vector<BINSortTuple>* tuples, const BINEFPreProcess& preProcess,
                             PairResult& result)
{
    if (!fAttributeReader->IsPreBinningEngaged())
    {
        result.fStatus = BinAttributeDirect(tuples, result.fCutPoints, result.fCells, result.fModelEntropy);
        return;
    }
    std::vector<double> cuts;
    if (preProcess.PreBinEqualFrequency(tuples, fRecordCount, cuts, result.fTotalWeight))
        result.fStatus = BinAttributePreBinned(tuples, cuts, result.fCutPoints, result.fCells, result.fModelEntropy);
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
