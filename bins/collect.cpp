#include "bins/collect.h"

#include <mcobnqrt/mcobnqrt.h>

#include <utility>

namespace
{

/// Null if no variable has the index.
std::shared_ptr<const Variable> FindVariable(const Bins& bins, int index)
{
    return index >= 0 && static_cast<std::size_t>(index) < bins.variables.size()
               ? bins.variables[static_cast<std::size_t>(index)]
               : nullptr;
}

std::optional<double> DecodeFigure(double figure)
{
    return figure == MCMV::gMissingValue ? std::nullopt : std::optional(DecodeInfinity(figure));
}

template<class LibraryResult>
AttributeBins MakeAttributeBins(const Bins& bins, const LibraryResult& result,
                                const std::vector<InfiniteValues>& values)
{
    AttributeBins made;
    made.attribute = FindVariable(bins, result.GetAttributeIndex());
    made.isRightClosed = bins.settings.isRightClosed;
    made.status = result.GetStatus();
    made.numDistinct = static_cast<std::int64_t>(result.GetNDistinctValues());
    made.weight = result.GetTotalWeight();
    made.weightWithMissing = result.GetTotalWeightWithMissing();
    if (!made.attribute)
        return made;
    const InfiniteValues& ownValues = values.at(static_cast<std::size_t>(result.GetAttributeIndex()));
    for (const double cutPoint : result.GetCutPoints())
        made.cutPoints.push_back(ownValues.DecodeCutPoint(cutPoint, made.isRightClosed));
    // With an error they are 0, which is no figure.
    if (!made.status.IsError())
    {
        made.minimum = DecodeFigure(result.GetMinimum());
        made.maximum = DecodeFigure(result.GetMaximum());
    }
    return made;
}

/// The weights of a row of cells by category. The row has no cells for the last categories if no record that counts is
/// of them.
std::vector<double> GetCategoryWeights(const std::vector<double>& row, const Variable& target)
{
    std::vector<double> weights(row.begin() + 1, row.end());
    weights.resize(target.categories.size());
    return weights;
}

} // namespace

void AddResult(Bins& bins, const BINAttributeTargetResults& result, const std::vector<InfiniteValues>& values)
{
    AttributeBins made = MakeAttributeBins(bins, result, values);
    made.target = FindVariable(bins, result.GetTargetIndex());
    if (!made.attribute || !made.target)
        return;
    for (const std::vector<double>& row : result.GetCellCounts())
    {
        if (!row.empty()) // as it is where nothing was binned
            made.AddBin(row.front(), GetCategoryWeights(row, *made.target));
    }
    if (made.HasBins())
        made.modelEntropy = DecodeFigure(result.GetModelEntropy());
    bins.results.push_back(std::move(made));
}

void AddResult(Bins& bins, const BINAttributeResults& result, const std::vector<InfiniteValues>& values)
{
    AttributeBins made = MakeAttributeBins(bins, result, values);
    if (!made.attribute)
        return;
    for (const double weight : result.GetCellCounts()) made.AddBin(weight, {});
    bins.results.push_back(std::move(made));
}
