#include "bins/edit.h"

#include "bins/measures.h"
#include "bins/numbers.h"

#include <algorithm>
#include <stdexcept>
#include <utility>

namespace
{

/// What stays when the bins between the cut points change.
AttributeBins MakeEdited(const AttributeBins& bins, std::vector<double> cutPoints)
{
    AttributeBins edited = bins;
    edited.bins.clear();
    edited.borderTexts.clear();
    edited.modelEntropy.reset();
    edited.cutPoints = std::move(cutPoints);
    edited.status = MCBinning::MCStatus();
    edited.isEdited = true;
    return edited;
}

/// Adds the weights of `part` to those of `whole`.
void AddWeights(Bin& whole, const Bin& part)
{
    whole.weight += part.weight;
    whole.weights.resize(part.weights.size());
    for (std::size_t code = 0; code < part.weights.size(); ++code) whole.weights[code] += part.weights[code];
}

} // namespace

AttributeBins JoinBins(const AttributeBins& bins, const std::vector<std::size_t>& kept)
{
    std::vector<double> cutPoints;
    for (const std::size_t index : kept)
    {
        if (index >= bins.cutPoints.size() || (!cutPoints.empty() && bins.cutPoints[index] <= cutPoints.back()))
            throw std::invalid_argument("there is no such cut point");
        cutPoints.push_back(bins.cutPoints[index]);
    }
    AttributeBins joined = MakeEdited(bins, std::move(cutPoints));
    std::size_t next = 0;
    Bin sum;
    for (std::size_t i = 0; i < bins.bins.size(); ++i)
    {
        AddWeights(sum, bins.bins[i]);
        const bool isLast = i + 1 == bins.bins.size() || (next < kept.size() && kept[next] == i);
        if (!isLast)
            continue;
        joined.AddBin(sum.weight, std::move(sum.weights));
        sum = Bin();
        ++next;
    }
    joined.modelEntropy = ComputeModelEntropy(joined);
    return joined;
}

AttributeBins MergeBins(const AttributeBins& bins, std::size_t first, std::size_t last)
{
    if (first >= last || last >= bins.bins.size())
    {
        throw std::invalid_argument("there are bins from 0 to " + std::to_string(bins.bins.size()) +
                                    ", of which two neighbours or more can be joined");
    }
    std::vector<std::size_t> kept;
    for (std::size_t cut = 0; cut < bins.cutPoints.size(); ++cut)
    {
        if (cut < first || cut >= last)
            kept.push_back(cut);
    }
    return JoinBins(bins, kept);
}

AttributeBins Recut(const AttributeBins& bins, const std::vector<double>& cutPoints)
{
    for (std::size_t i = 0; i < cutPoints.size(); ++i)
    {
        const bool isAbove = i == 0 ? cutPoints[i] == cutPoints[i] : cutPoints[i] > cutPoints[i - 1];
        if (!isAbove)
            throw std::invalid_argument("cut points must rise, and " + FormatNumber(cutPoints[i]) + " does not");
    }
    AttributeBins recut = MakeEdited(bins, cutPoints);
    const std::size_t numCategories = bins.target ? bins.target->categories.size() : 0;
    for (std::size_t i = 0; i <= cutPoints.size(); ++i) recut.AddBin(0.0, std::vector<double>(numCategories));
    recut.weight = recut.weightWithMissing = 0.0;
    recut.numDistinct.reset();
    recut.minimum = recut.maximum = std::nullopt;
    recut.missing.reset();
    recut.categories.clear();
    return recut;
}

Bins ReplaceResult(const Bins& bins, std::size_t index, AttributeBins result)
{
    Bins replaced = bins;
    replaced.results.at(index) = std::move(result);
    return replaced;
}
