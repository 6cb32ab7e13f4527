#include "bins/bintally.h"

#include "bins/edit.h"
#include "bins/measures.h"

#include <algorithm>
#include <limits>

namespace
{

/// Without borders and weight.
Bin MakeGroup(std::size_t numCategories)
{
    Bin group;
    group.left = group.right = std::numeric_limits<double>::quiet_NaN();
    group.weights.resize(numCategories);
    return group;
}

/// \param code of the category, if the bin has weights by category.
void AddTo(Bin& bin, std::size_t code, double weight)
{
    bin.weight += weight;
    if (!bin.weights.empty())
        bin.weights[code] += weight;
}

} // namespace

BinTally::BinTally(const AttributeBins& bins, bool hasTarget) : fKnown(bins), fBins(Recut(bins, bins.cutPoints))
{
    fRanges.resize(fBins.bins.size());
    fHasTarget = hasTarget && bins.target != nullptr;
    fBins.isEdited = bins.isEdited;
    if (!fHasTarget)
    {
        fBins.target.reset();
        for (Bin& bin : fBins.bins) bin.weights.clear();
    }
    const std::size_t numCategories = fHasTarget ? bins.target->categories.size() : 0;
    fBins.missing = MakeGroup(numCategories);
    fStrangers.unseen = MakeGroup(numCategories);
    if (bins.attribute->IsCategorical() && bins.HasBins())
        fBins.categories.resize(bins.attribute->categories.size(), MakeGroup(numCategories));
}

void BinTally::Add(const Binner::Found& found, std::optional<std::size_t> code, double weight)
{
    fBins.weightWithMissing += weight;
    if (found.bin)
        fRanges[*found.bin].Add(found.value);
    if (fHasTarget && !code)
        return;
    const std::size_t category = code.value_or(0);
    if (found.isBad)
        AddTo(fStrangers.unseen, category, weight);
    else if (!found.bin)
        AddTo(*fBins.missing, category, weight);
    else
    {
        AddTo(fBins.bins[*found.bin], category, weight);
        if (!fBins.categories.empty())
            AddTo(fBins.categories[static_cast<std::size_t>(found.value)], category, weight);
        fBins.weight += weight;
        AddValue(found.value, weight);
    }
}

void BinTally::Widen(const Binner::Found& found, std::optional<std::size_t> code)
{
    if (!found.bin)
        return;
    fRanges[*found.bin].Add(found.value);
    if (!fHasTarget || code)
        AddValue(found.value, 0.0);
}

void BinTally::AddValue(double value, double weight)
{
    fBins.minimum = std::min(fBins.minimum.value_or(value), value);
    fBins.maximum = std::max(fBins.maximum.value_or(value), value);
    if (value < fKnown.minimum)
        fStrangers.below += weight;
    if (value > fKnown.maximum && fKnown.maximum)
        fStrangers.above += weight;
}

void BinTally::NameUnseen(std::string_view category)
{
    constexpr std::size_t kMost = 10;
    std::vector<std::string>& names = fStrangers.unseenCategories;
    if (names.size() < kMost && std::find(names.begin(), names.end(), category) == names.end())
        names.emplace_back(category);
}

AttributeBins BinTally::GetBins() const
{
    AttributeBins bins = fBins;
    bins.modelEntropy = ComputeModelEntropy(bins);
    return bins;
}
