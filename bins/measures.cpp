#include "bins/measures.h"

#include <algorithm>
#include <cmath>
#include <numeric>

namespace
{

/// Weights of the event and of all other categories.
struct Sides
{
    double events = 0.0;
    double others = 0.0;

    /// Whether the weight of evidence would be infinite.
    bool IsOneSided() const { return (events == 0.0) != (others == 0.0); }
};

Sides Split(const std::vector<double>& weights, std::size_t event)
{
    Sides sides;
    for (std::size_t code = 0; code < weights.size(); ++code)
        (code == event ? sides.events : sides.others) += weights[code];
    return sides;
}

Evidence MakeEvidence(const Bin& bin, std::size_t event, double smoothing, const Sides& all)
{
    const Sides sides = Split(bin.weights, event);
    const double added = sides.IsOneSided() ? smoothing : 0.0;
    const double events = ComputeShare(sides.events + added, all.events);
    const double others = ComputeShare(sides.others + added, all.others);
    const double weightOfEvidence = events == others ? 0.0 : std::log(events / others);
    return {ComputeShare(sides.events, bin.weight), weightOfEvidence, (events - others) * weightOfEvidence};
}

/// In bits. The form of the formula is the library's, as the last bit depends on it.
double ComputeBinEntropy(const Bin& bin)
{
    static const double kLn2 = std::log(2.0);
    double entropy = 0.0;
    for (const double weight : bin.weights)
    {
        const double share = ComputeShare(weight, bin.weight);
        const double p = share == 0.0 ? 1.0 : share; // an absent category adds nothing
        entropy = -(std::log(p) / kLn2 * p) + entropy;
    }
    return entropy;
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

std::optional<double> ComputeModelEntropy(const AttributeBins& bins)
{
    double weight = 0.0;
    double sum = 0.0;
    for (const Bin& bin : bins.bins)
    {
        weight += bin.weight;
        sum += ComputeBinEntropy(bin) * bin.weight;
    }
    return bins.target && weight > 0.0 ? std::optional(sum / weight) : std::nullopt;
}

double ComputeShare(double part, double whole)
{
    return whole > 0.0 ? part / whole : 0.0;
}

std::optional<std::size_t> FindEvent(const AttributeBins& bins)
{
    return bins.target && bins.target->categories.size() == 2 ? std::optional<std::size_t>(1) : std::nullopt;
}

std::vector<Evidence> ComputeEvidence(const AttributeBins& bins, std::size_t event)
{
    const std::vector<const Bin*> groups = ListGroups(bins);
    Sides all;
    for (const Bin* const group : groups)
    {
        const Sides sides = Split(group->weights, event);
        all.events += sides.events;
        all.others += sides.others;
    }
    std::vector<Evidence> evidence;
    if (all.events > 0.0 && all.others > 0.0)
    {
        for (const Bin* const group : groups) evidence.push_back(MakeEvidence(*group, event, bins.smoothing, all));
    }
    return evidence;
}

std::vector<Evidence> ComputeEvidence(const AttributeBins& bins)
{
    const std::optional<std::size_t> event = FindEvent(bins);
    return event ? ComputeEvidence(bins, *event) : std::vector<Evidence>();
}

bool IsSmoothed(const AttributeBins& bins)
{
    if (bins.smoothing == 0.0 || !bins.target)
        return false;
    const std::size_t numEvents = FindEvent(bins) ? 1 : bins.target->categories.size(); // of two one is as good as both
    for (std::size_t event = 0; event < numEvents; ++event)
    {
        const std::vector<const Bin*> groups = ListGroups(bins);
        const auto isOneSided = [event](const Bin* group) { return Split(group->weights, event).IsOneSided(); };
        if (!ComputeEvidence(bins, event).empty() && std::any_of(groups.begin(), groups.end(), isOneSided))
            return true;
    }
    return false;
}

bool HasMissing(const AttributeBins& bins)
{
    return bins.missing && bins.missing->weight > 0.0;
}

std::optional<double> ComputeInformationValue(const AttributeBins& bins, std::size_t event)
{
    const std::vector<Evidence> evidence = ComputeEvidence(bins, event);
    if (evidence.empty())
        return std::nullopt;
    double value = 0.0;
    for (const Evidence& one : evidence) value += one.informationValue;
    return value;
}

std::optional<double> ComputeInformationValue(const AttributeBins& bins)
{
    const std::optional<std::size_t> event = FindEvent(bins);
    return event ? ComputeInformationValue(bins, *event) : std::nullopt;
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
