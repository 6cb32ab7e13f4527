#include "bins/categorytally.h"

namespace
{

/// The position in a list by code; nothing if the value is no code of it, as one that is missing.
std::optional<std::size_t> FindCode(double value, std::size_t numCodes)
{
    return value >= 0.0 && value < static_cast<double>(numCodes) ? std::optional(static_cast<std::size_t>(value))
                                                                 : std::nullopt;
}

std::size_t CountCategories(const std::vector<std::shared_ptr<const Variable>>& variables, int index)
{
    return variables.at(static_cast<std::size_t>(index))->categories.size();
}

} // namespace

CategoryTally::CategoryTally(const std::vector<std::shared_ptr<const Variable>>& variables,
                             const std::vector<Pair>& pairs)
    : fWeight(FindWeight(variables))
{
    for (const Pair& pair : pairs)
    {
        if (!variables.at(static_cast<std::size_t>(pair.attribute))->IsCategorical() || Find(pair) != nullptr)
            continue;
        const std::size_t numTargets = pair.target ? CountCategories(variables, *pair.target) : 1;
        const std::vector<double> noWeight(numTargets);
        fCounts.push_back(
            {pair, std::vector<std::vector<double>>(CountCategories(variables, pair.attribute), noWeight)});
    }
}

void CategoryTally::Add(const MCCommon::Record& record)
{
    const double weight = GetWeight(record, fWeight);
    if (!(weight > 0.0))
        return;
    for (Count& count : fCounts)
    {
        const std::optional<std::size_t> code = FindCode(record[count.pair.attribute], count.weights.size());
        if (!code)
            continue;
        std::vector<double>& ofCategory = count.weights[*code];
        const std::optional<std::size_t> target =
            count.pair.target ? FindCode(record[*count.pair.target], ofCategory.size()) : 0;
        if (target)
            ofCategory[*target] += weight;
    }
}

const std::vector<std::vector<double>>* CategoryTally::Find(const Pair& pair) const
{
    for (const Count& count : fCounts)
    {
        if (count.pair.attribute == pair.attribute && count.pair.target == pair.target)
            return &count.weights;
    }
    return nullptr;
}

std::optional<int> FindWeight(const std::vector<std::shared_ptr<const Variable>>& variables)
{
    for (std::size_t i = 0; i < variables.size(); ++i)
    {
        if (variables[i]->role == VariableRole::kWeight)
            return static_cast<int>(i);
    }
    return std::nullopt;
}
