#include <mcobnqrt/efbinoutput.h>

#include "results/resultparts.h"

#include <cstddef>
#include <type_traits>
#include <utility>

using MCBinning::MCStatus;

// What is moved in or out below, after the last allocation, must not fail any more.
static_assert(std::is_nothrow_move_constructible_v<BINAttributeResults>);
static_assert(std::is_nothrow_move_assignable_v<BINAttributeResults>);

EFBINOutput::EFBINOutput() = default;

EFBINOutput::EFBINOutput(const EFBINOutput& other) = default;

EFBINOutput& EFBINOutput::operator=(const EFBINOutput& other)
{
    EFBINOutput copy(other);
    fResults.swap(copy.fResults);
    fResultIndex.swap(copy.fResultIndex);
    return *this;
}

EFBINOutput::~EFBINOutput() = default;

MCStatus EFBINOutput::SetAttributeResults(MCStatus status, const std::vector<double>& cutPoints,
                                          const std::vector<double>& cellCounts, int attribute,
                                          unsigned int numDistinctValues, double totalWeight,
                                          double totalWeightWithMissing, double minimum, double maximum)
{
    if (attribute < 0)
        return MakeError(MCBinning::BINStatusBadAttributeIndex);

    BINAttributeResults entry;
    entry.fStatus = status;
    entry.fAttributeIndex = attribute;
    entry.fCutPoints = cutPoints;
    entry.fCellCounts = cellCounts;
    entry.fNDistinctValues = numDistinctValues;
    entry.fTotalWeight = totalWeight;
    entry.fTotalWeightWithMissing = totalWeightWithMissing;
    entry.fMinimum = minimum;
    entry.fMaximum = maximum;

    // The node of the index is allocated ahead of the entry, and linking it in can't throw: both fields grow, or
    // neither does. An attribute that has an entry already keeps its node.
    decltype(fResultIndex) node;
    node.emplace(attribute, static_cast<int>(fResults.size()));
    fResults.push_back(std::move(entry));
    fResultIndex.merge(node);
    return MCStatus();
}

MCStatus EFBINOutput::GetAttributeCutPoints(int attribute, BINAttributeResults& results) const
{
    const auto found = fResultIndex.find(attribute);
    if (found == fResultIndex.end())
        return MakeError(MCBinning::BINStatusIndexOutOfRange);
    return CopyEntry(fResults[static_cast<std::size_t>(found->second)], results);
}

MCStatus EFBINOutput::GetAllCutPoints(std::vector<BINAttributeResults>& results) const
{
    return CopyAllEntries(fResults, results);
}

void EFBINOutput::Display(std::ostream& os) const
{
    DisplayEntries(os, "EFBINOutput", fResults);
}
