#include <mcobnqrt/binoutput.h>

#include "base/growth.h"
#include "results/resultparts.h"

#include <cstddef>
#include <iterator>
#include <type_traits>

using MCBinning::MCStatus;

namespace
{

// What is moved in or out below, after the last allocation, must not fail any more.
static_assert(std::is_nothrow_move_constructible_v<BINAttributeTargetResults>);
static_assert(std::is_nothrow_move_assignable_v<BINAttributeTargetResults>);

/// Cuts a flat table into `numRows` rows of the same length; what is left over at its end is dropped.
std::vector<std::vector<double>> SplitIntoRows(const std::vector<double>& cells, std::size_t numRows)
{
    const std::size_t rowLength = cells.size() / numRows;
    std::vector<std::vector<double>> rows;
    rows.reserve(numRows);
    auto next = cells.begin();
    while (rows.size() < numRows)
    {
        const auto end = next + static_cast<std::ptrdiff_t>(rowLength);
        rows.emplace_back(next, end);
        next = end;
    }
    return rows;
}

bool IsPair(int attribute, int target)
{
    return attribute >= 0 && target >= 0 && attribute != target;
}

} // namespace

BINOutput::BINOutput() = default;

BINOutput::BINOutput(const BINOutput& other) = default;

BINOutput& BINOutput::operator=(const BINOutput& other)
{
    BINOutput copy(other);
    fResults.swap(copy.fResults);
    fResultIndex.swap(copy.fResultIndex);
    fAttributeIndex.swap(copy.fAttributeIndex);
    return *this;
}

BINOutput::~BINOutput() = default;

MCStatus BINOutput::SetAttributeTargetResults(MCStatus status, const std::set<double>& cutPoints,
                                              const std::vector<double>& cellCounts, int attribute, int target,
                                              unsigned int numDistinctValues, double totalWeight,
                                              double totalWeightWithMissing, double minimum, double maximum,
                                              double modelEntropy)
{
    if (!IsPair(attribute, target))
        return MakeError(MCBinning::BINStatusIndexOutOfRange);

    BINAttributeTargetResults entry;
    entry.fStatus = status;
    entry.fAttributeIndex = attribute;
    entry.fTargetIndex = target;
    entry.fCutPoints.assign(cutPoints.begin(), cutPoints.end());
    entry.fCellCounts = SplitIntoRows(cellCounts, cutPoints.size() + 1);
    entry.fNDistinctValues = numDistinctValues;
    entry.fTotalWeight = totalWeight;
    entry.fTotalWeightWithMissing = totalWeightWithMissing;
    entry.fMinimum = minimum;
    entry.fMaximum = maximum;
    entry.fModelEntropy = modelEntropy;

    // What the indices need is allocated ahead of the entry, and linking it in can't throw: all fields grow, or none
    // does. A pair that has an entry already keeps its node, so that its first entry is the one that is found.
    const int index = static_cast<int>(fResults.size());
    decltype(fResultIndex) node;
    node.emplace(std::make_pair(attribute, target), index);
    std::vector<int>& indicesOfAttribute = fAttributeIndex[attribute];
    ReserveOneMore(indicesOfAttribute);
    fResults.push_back(std::move(entry));
    fResultIndex.merge(node);
    indicesOfAttribute.push_back(index);
    return MCStatus();
}

MCStatus BINOutput::GetAttributeTargetCutPoints(int attribute, int target, BINAttributeTargetResults& results) const
{
    // Indices that can't form a pair were never stored, so they are not found.
    const auto found = fResultIndex.find({attribute, target});
    if (found == fResultIndex.end())
        return MakeError(MCBinning::BINStatusIndexOutOfRange);
    return CopyEntry(fResults[static_cast<std::size_t>(found->second)], results);
}

MCStatus BINOutput::GetAttributeCutPoints(int attribute, std::vector<BINAttributeTargetResults>& results) const
{
    const auto indices = fAttributeIndex.find(attribute);
    // A store that failed for want of memory may have left an attribute without an entry.
    if (indices == fAttributeIndex.end() || indices->second.empty())
        return MakeError(MCBinning::BINStatusIndexOutOfRange);

    std::vector<BINAttributeTargetResults> found;
    found.reserve(indices->second.size());
    for (const int index : indices->second) found.push_back(fResults[static_cast<std::size_t>(index)]);
    const MCStatus lastStatus = found.back().GetStatus();
    ReserveMore(results, found.size()); // the last allocation
    std::move(found.begin(), found.end(), std::back_inserter(results));
    return lastStatus;
}

MCStatus BINOutput::GetAllCutPoints(std::vector<BINAttributeTargetResults>& results) const
{
    return CopyAllEntries(fResults, results);
}

void BINOutput::Display(std::ostream& os) const
{
    DisplayEntries(os, "BINOutput", fResults);
}
