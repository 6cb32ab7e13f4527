#include "hosts/python/src/libraryblocks.h"

#include <mcobnqrt/mccommon.h>

using MCMV::gMissingValue;

namespace
{

void ConvertValues(const Variable& variable, InfiniteValues& encoder, double* values, std::size_t count)
{
    const bool hasMissing = variable.HasMissingNumbers();
    for (std::size_t i = 0; i < count; ++i)
    {
        if (values[i] == gMissingValue)
            continue;
        const bool isMissing = hasMissing && variable.missingNumbers.Contains(values[i]);
        values[i] = isMissing ? gMissingValue : encoder.Encode(values[i]);
    }
}

} // namespace

std::optional<std::size_t> FindWeight(const std::vector<Variable>& variables)
{
    for (std::size_t i = 0; i < variables.size(); ++i)
    {
        if (variables[i].use == Variable::Use::kWeight)
            return i;
    }
    return std::nullopt;
}

TalliedBlocks::TalliedBlocks(BlockSource& source, const std::vector<Variable>& variables)
    : fSource(source), fWeight(FindWeight(variables))
{
    if (fWeight)
        fTally.rounding = variables[*fWeight].rounding;
}

bool TalliedBlocks::Next(Block& block)
{
    if (!fSource.Next(block))
        return false;
    if (!fWeight)
        return true;
    const double* const weights = block.GetField(*fWeight);
    for (std::size_t i = 0; i < block.numRows; ++i)
    {
        if (weights[i] != gMissingValue)
            fTally.Add(weights[i]);
    }
    return true;
}

LibraryBlocks::LibraryBlocks(BlockSource& source, const std::vector<Variable>& variables, const WeightTally& tally)
    : fSource(source), fVariables(variables), fWeightGrid(tally), fValues(variables.size())
{
}

bool LibraryBlocks::Next(Block& block)
{
    if (!fSource.Next(block))
        return false;
    for (std::size_t i = 0; i < fVariables.size(); ++i)
    {
        if (fVariables[i].use == Variable::Use::kWeight)
            ConvertWeights(block.GetField(i), block.numRows);
        else if (fVariables[i].use == Variable::Use::kAttribute)
            ConvertValues(fVariables[i], fValues[i], block.GetField(i), block.numRows);
    }
    return true;
}

std::optional<std::int64_t> LibraryBlocks::GetNumWithoutWeight() const
{
    return FindWeight(fVariables) ? std::optional(fNumWithoutWeight) : std::nullopt;
}

void LibraryBlocks::ConvertWeights(double* weights, std::size_t count)
{
    for (std::size_t i = 0; i < count; ++i)
    {
        if (weights[i] == gMissingValue)
            ++fNumWithoutWeight;
        else
            weights[i] = fWeightGrid.Round(weights[i]);
    }
}
