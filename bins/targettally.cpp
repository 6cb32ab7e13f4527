#include "bins/targettally.h"

#include <mcobnqrt/mccommon.h>

#include <algorithm>
#include <limits>
#include <numeric>
#include <set>
#include <utility>

TargetTally::TargetTally(IBINRecordSource& records, const std::vector<std::shared_ptr<const Variable>>& variables,
                         const std::vector<CategoryTally::Pair>& pairs)
    : fRecords(records), fVariables(variables), fWeight(FindWeight(variables)), fCategories(variables, pairs)
{
    std::set<int> targets;
    for (const CategoryTally::Pair& pair : pairs)
    {
        if (pair.target)
            targets.insert(*pair.target);
    }
    for (const int target : targets)
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
    const double weight = GetWeight(*record, fWeight);
    if (!(weight > 0.0)) // nor is a missing one
        return record;
    fCategories.Add(*record);
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

std::vector<Bin> TargetTally::FindCategories(const AttributeBins& bins) const
{
    std::vector<Bin> categories;
    if (!bins.HasBins() || !bins.attribute->IsCategorical())
        return categories;
    const std::optional<int> target = bins.target ? std::optional(FindIndex(bins.target.get())) : std::nullopt;
    const std::vector<std::vector<double>>* const weights = fCategories.Find({FindIndex(bins.attribute.get()), target});
    if (weights == nullptr)
        return categories;
    for (const std::vector<double>& ofCategory : *weights)
    {
        Bin category;
        category.left = category.right = std::numeric_limits<double>::quiet_NaN();
        category.weight = std::accumulate(ofCategory.begin(), ofCategory.end(), 0.0);
        if (target)
            category.weights = ofCategory;
        categories.push_back(std::move(category));
    }
    return categories;
}

int TargetTally::FindIndex(const Variable* variable) const
{
    const auto isIt = [variable](const std::shared_ptr<const Variable>& other) { return other.get() == variable; };
    return static_cast<int>(std::find_if(fVariables.begin(), fVariables.end(), isIt) - fVariables.begin());
}
