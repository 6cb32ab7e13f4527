#include "bins/targettally.h"

#include <mcobnqrt/mccommon.h>

#include <limits>
#include <set>

TargetTally::TargetTally(IBINRecordSource& records, const std::vector<std::shared_ptr<const Variable>>& variables,
                         const std::vector<int>& targets)
    : fRecords(records)
{
    for (std::size_t i = 0; i < variables.size(); ++i)
    {
        if (variables[i]->role == VariableRole::kWeight)
            fWeight = static_cast<int>(i);
    }
    for (const int target : std::set<int>(targets.begin(), targets.end()))
    {
        const Variable* const variable = variables.at(static_cast<std::size_t>(target)).get();
        fTargets.push_back({variable, target, std::vector<double>(variable->categories.size())});
    }
}

const MCCommon::Record* TargetTally::Next()
{
    const MCCommon::Record* const record = fRecords.Next();
    if (record == nullptr)
        return record;
    const double weight = fWeight ? (*record)[*fWeight] : 1.0;
    if (!(weight > 0.0)) // nor is a missing one
        return record;
    for (Target& target : fTargets)
    {
        const double code = (*record)[target.index];
        if (code >= 0.0 && code < static_cast<double>(target.weights.size()))
            target.weights[static_cast<std::size_t>(code)] += weight;
    }
    return record;
}

std::optional<Bin> TargetTally::FindMissing(const AttributeBins& bins) const
{
    if (!bins.HasBins())
        return std::nullopt;
    Bin missing;
    missing.left = missing.right = std::numeric_limits<double>::quiet_NaN();
    missing.weight = bins.weightWithMissing - bins.weight;
    for (const Target& target : fTargets)
    {
        if (target.variable != bins.target.get())
            continue;
        missing.weights = target.weights;
        missing.weight = 0.0;
        for (std::size_t code = 0; code < missing.weights.size(); ++code)
        {
            for (const Bin& bin : bins.bins) missing.weights[code] -= bin.weights[code];
            missing.weight += missing.weights[code];
        }
    }
    return missing;
}
