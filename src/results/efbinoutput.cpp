#include <mcobnqrt/efbinoutput.h>

#include "results/resultparts.h"

#include <algorithm>
#include <type_traits>

using MCBinning::MCStatus;

// What is moved in or out below, after the last allocation, must not fail any more.
static_assert(std::is_nothrow_move_constructible_v<BINAttributeResults>);
static_assert(std::is_nothrow_move_assignable_v<BINAttributeResults>);

EFBINOutput::EFBINOutput() = default;

EFBINOutput::EFBINOutput(const EFBINOutput& other) = default;

EFBINOutput& EFBINOutput::operator=(const EFBINOutput& other)
{
    fResults = std::vector<BINAttributeResults>(other.fResults);
    return *this;
}

EFBINOutput::~EFBINOutput() = default;

MCStatus EFBINOutput::SetAttributeResults(MCStatus status, const std::vector<double>& cutPoints,
                                          const std::vector<double>& cellCounts, int attribute,
                                          unsigned int nDistinctValues, double totalWeight,
                                          double totalWeightWithMissing, double minimum, double maximum)
{
    if (attribute < 0)
        return MakeError(MCBinning::BINStatusBadAttributeIndex);

    BINAttributeResults entry;
    entry.fStatus = status;
    entry.fAttributeIndex = attribute;
    entry.fCutPoints = cutPoints;
    entry.fCellCounts = cellCounts;
    entry.fNDistinctValues = nDistinctValues;
    entry.fTotalWeight = totalWeight;
    entry.fTotalWeightWithMissing = totalWeightWithMissing;
    entry.fMinimum = minimum;
    entry.fMaximum = maximum;
    fResults.push_back(std::move(entry));
    return MCStatus();
}

MCStatus EFBINOutput::GetAttributeCutPoints(int attribute, BINAttributeResults& results) const
{
    const auto found =
        std::find_if(fResults.begin(), fResults.end(),
                     [attribute](const BINAttributeResults& entry) { return entry.GetAttributeIndex() == attribute; });
    if (found == fResults.end())
        return MakeError(MCBinning::BINStatusIndexOutOfRange);
    return CopyEntry(*found, results);
}

MCStatus EFBINOutput::GetAllCutPoints(std::vector<BINAttributeResults>& results) const
{
    return CopyAllEntries(fResults, results);
}

void EFBINOutput::Display(std::ostream& os) const
{
    DisplayEntries(os, "EFBINOutput", fResults);
}
