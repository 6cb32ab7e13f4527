#include "bins/measures.h"

#include <algorithm>
#include <cmath>
#include <numeric>

namespace
{

/// Whether the weight of evidence of a bin, or of the missing, would be infinite.
bool IsOneSided(const Bin& bin)
{
    return bin.weight > 0.0 && (bin.weights[0] == 0.0 || bin.weights[1] == 0.0);
}

Evidence MakeEvidence(const Bin& bin, double smoothing, const std::vector<double>& categoryWeights)
{
    const double added = IsOneSided(bin) ? smoothing : 0.0;
    const double events = ComputeShare(bin.weights[1] + added, categoryWeights[1]);
    const double others = ComputeShare(bin.weights[0] + added, categoryWeights[0]);
    const double weightOfEvidence = events == others ? 0.0 : std::log(events / others);
    return {ComputeShare(bin.weights[1], bin.weight), weightOfEvidence, (events - others) * weightOfEvidence};
}

/// The bins, and behind them the missing if they have weight.
std::vector<const Bin*> ListGroups(const AttributeBins& bins)
{
    std::vector<const Bin*> groups;
    for (const Bin& bin : bins.bins) groups.push_back(&bin);
    if (HasMissing(bins))
        groups.push_back(&*bins.missing);
    return groups;
}

} // namespace

double ComputeEntropy(const std::vector<double>& weights)
{
    const double total = std::accumulate(weights.begin(), weights.end(), 0.0);
    double entropy = 0.0;
    for (const double weight : weights)
    {
        if (weight > 0.0)
            entropy -= weight / total * std::log2(weight / total);
    }
    return entropy;
}

std::vector<double> SumByCategory(const AttributeBins& bins)
{
    std::vector<double> sums(bins.target ? bins.target->categories.size() : 0);
    for (const Bin& bin : bins.bins)
    {
        for (std::size_t code = 0; code < sums.size(); ++code) sums[code] += bin.weights[code];
    }
    return sums;
}

std::optional<double> ComputeTargetEntropy(const AttributeBins& bins)
{
    if (!bins.target || !bins.HasBins())
        return std::nullopt;
    return ComputeEntropy(SumByCategory(bins));
}

std::optional<double> ComputeGain(const AttributeBins& bins)
{
    const std::optional<double> targetEntropy = ComputeTargetEntropy(bins);
    if (!targetEntropy || !bins.modelEntropy)
        return std::nullopt;
    // No cut raises the entropy, so a difference below this is what rounding has left.
    constexpr double kRounding = 1e-12;
    const double gain = *targetEntropy - *bins.modelEntropy;
    return bins.cutPoints.empty() || gain < kRounding * std::max(1.0, *targetEntropy) ? 0.0 : gain;
}

double ComputeShare(double part, double whole)
{
    return whole > 0.0 ? part / whole : 0.0;
}

std::vector<Evidence> ComputeEvidence(const AttributeBins& bins)
{
    std::vector<double> categoryWeights = SumByCategory(bins);
    if (HasMissing(bins))
    {
        for (std::size_t code = 0; code < categoryWeights.size(); ++code)
            categoryWeights[code] += bins.missing->weights[code];
    }
    std::vector<Evidence> evidence;
    if (categoryWeights.size() == 2 && categoryWeights[0] > 0.0 && categoryWeights[1] > 0.0)
    {
        for (const Bin* const group : ListGroups(bins))
            evidence.push_back(MakeEvidence(*group, bins.smoothing, categoryWeights));
    }
    return evidence;
}

bool IsSmoothed(const AttributeBins& bins)
{
    const std::vector<const Bin*> groups = ListGroups(bins);
    return bins.smoothing > 0.0 && !ComputeEvidence(bins).empty() &&
           std::any_of(groups.begin(), groups.end(), [](const Bin* group) { return IsOneSided(*group); });
}

bool HasMissing(const AttributeBins& bins)
{
    return bins.missing && bins.missing->weight > 0.0;
}

std::optional<double> ComputeInformationValue(const AttributeBins& bins)
{
    const std::vector<Evidence> evidence = ComputeEvidence(bins);
    if (evidence.empty())
        return std::nullopt;
    double value = 0.0;
    for (const Evidence& one : evidence) value += one.informationValue;
    return value;
}

std::vector<const AttributeBins*> SortByGain(const Bins& bins)
{
    std::vector<const AttributeBins*> sorted;
    for (const AttributeBins& result : bins.results)
    {
        if (!result.cutPoints.empty())
            sorted.push_back(&result);
    }
    std::stable_sort(sorted.begin(), sorted.end(),
                     [](const AttributeBins* left, const AttributeBins* right)
                     { return ComputeGain(*left).value_or(0.0) > ComputeGain(*right).value_or(0.0); });
    return sorted;
}
