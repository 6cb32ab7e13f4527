#include "bins/run.h"

#include "bins/collect.h"
#include "bins/targettally.h"

#include <mcobnqrt/mcobnqrt.h>

#include <memory>

namespace
{

template<class LibrarySettings>
LibrarySettings MakeSettings(const Settings& settings, const RunHost& host)
{
    LibrarySettings made;
    made.SetNumberOfBins(settings.numBins);
    made.SetRightBorderClosed(settings.isRightClosed);
    made.SetCancelPointer(host.cancel);
    made.SetProgressListener(host.listener);
    if (host.numRecordsBetweenReports > 0)
        made.SetNSkippedCasesReports(host.numRecordsBetweenReports);
    if (!host.tempDirectory.empty())
        made.SetTempDirName(host.tempDirectory);
    return made;
}

/// Takes all that the algorithm has found in a run that ended with `status`.
template<class LibraryResult, class Algorithm>
void Collect(Bins& bins, const MCBinning::MCStatus& status, Algorithm& algorithm, const RunHost& host,
             const TargetTally& tally)
{
    bins.status = status;
    bins.componentVersion = algorithm.GetVersionString();
    std::vector<LibraryResult> results;
    algorithm.GetOutput()->GetAllCutPoints(results); // its only refusal is that there are none
    for (const LibraryResult& result : results) AddResult(bins, result, *host.values);
    for (AttributeBins& result : bins.results)
    {
        result.missing = tally.FindMissing(result);
        result.categories = tally.FindCategories(result);
        result.smoothing = bins.settings.smoothing;
    }
}

/// What will be binned: the pairs, or all attributes with the target of the list, if it has one.
std::vector<CategoryTally::Pair> FindPairs(const Bins& bins, const BINVarList& variables,
                                           const std::vector<int>* attributes, const std::vector<int>* targets)
{
    const int ofList = variables.GetTargetIndex();
    std::optional<int> target;
    if (bins.settings.method == Method::kSupervised && ofList >= 0)
        target = ofList;
    std::vector<CategoryTally::Pair> pairs;
    if (attributes == nullptr)
    {
        for (std::size_t i = 0; i < bins.variables.size(); ++i)
        {
            if (bins.variables[i]->role == VariableRole::kAttribute)
                pairs.push_back({static_cast<int>(i), target});
        }
        return pairs;
    }
    for (std::size_t i = 0; i < attributes->size(); ++i)
        pairs.push_back({(*attributes)[i], targets != nullptr ? std::optional((*targets)[i]) : target});
    return pairs;
}

void RunSupervised(Bins& bins, BINVarList& variables, const std::vector<int>* attributes,
                   const std::vector<int>* targets, const RunHost& host)
{
    auto settings = MakeSettings<BINSettings>(bins.settings, host);
    settings.SetSmallBinDetectionThreshold(bins.settings.smallBinRatio.value_or(0.0));
    if (bins.settings.maxDistinct)
        settings.SetNumDistinctValueThreshold(*bins.settings.maxDistinct);
    BINFactory factory;
    const std::unique_ptr<IBINAlgorithm> algorithm(factory.CreateBINAlgorithm(settings, variables));
    if (!algorithm)
    {
        bins.status = factory.GetStatus();
        return;
    }
    TargetTally records(*host.records, bins.variables, FindPairs(bins, variables, attributes, targets));
    const MCBinning::MCStatus status = algorithm->Run(&records, attributes, targets);
    Collect<BINAttributeTargetResults>(bins, status, *algorithm, host, records);
}

void RunEqualFrequency(Bins& bins, BINVarList& variables, const std::vector<int>* attributes, const RunHost& host)
{
    auto settings = MakeSettings<EFBINSettings>(bins.settings, host);
    EFBINFactory factory;
    const std::unique_ptr<IEFBINAlgorithm> algorithm(factory.CreateEFBINAlgorithm(settings, variables));
    if (!algorithm)
    {
        bins.status = factory.GetStatus();
        return;
    }
    TargetTally records(*host.records, bins.variables, FindPairs(bins, variables, attributes, nullptr));
    const MCBinning::MCStatus status = algorithm->Run(&records, attributes);
    Collect<BINAttributeResults>(bins, status, *algorithm, host, records);
}

} // namespace

void RunBinning(Bins& bins, BINVarList& variables, const std::vector<int>* attributes, const std::vector<int>* targets,
                const RunHost& host)
{
    if (bins.settings.method == Method::kSupervised)
        RunSupervised(bins, variables, attributes, targets, host);
    else
        RunEqualFrequency(bins, variables, attributes, host);
    SetWeightGrid(bins, host.weightGrid->GetStep());
}

void SetWeightGrid(Bins& bins, std::optional<double> step)
{
    for (std::shared_ptr<const Variable>& variable : bins.variables)
    {
        if (variable->role != VariableRole::kWeight)
            continue;
        auto withGrid = std::make_shared<Variable>(*variable); // no result points to a weight
        withGrid->weightGrid = step;
        variable = std::move(withGrid);
    }
}
