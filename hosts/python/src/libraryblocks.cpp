#include "hosts/python/src/libraryblocks.h"

#include <mcobnqrt/mccommon.h>

#include <algorithm>

using MCMV::gMissingValue;

namespace
{

void ConvertValues(const Field& field, InfiniteValues& encoder, double* values, std::size_t count)
{
    const bool hasMissing = field.HasMissingNumbers();
    for (std::size_t i = 0; i < count; ++i)
    {
        if (values[i] == gMissingValue)
            continue;
        const bool isMissing = hasMissing && field.missingNumbers.Contains(values[i]);
        values[i] = isMissing ? gMissingValue : encoder.Encode(values[i]);
    }
}

void ConvertCodes(const Field& field, double* codes, std::size_t count)
{
    for (std::size_t i = 0; i < count && !field.recoding.codes.empty(); ++i)
    {
        if (codes[i] >= 0.0)
            codes[i] = field.recoding.codes[static_cast<std::size_t>(codes[i])];
    }
}

} // namespace

std::optional<std::size_t> FindWeight(const std::vector<Field>& fields)
{
    for (std::size_t i = 0; i < fields.size(); ++i)
    {
        if (fields[i].use == Field::Use::kWeight)
            return i;
    }
    return std::nullopt;
}

TalliedBlocks::TalliedBlocks(BlockSource& source, std::vector<Field>& fields)
    : fSource(source), fFields(fields), fWeight(FindWeight(fields))
{
    if (fWeight)
        fTally.rounding = fields[*fWeight].rounding;
}

bool TalliedBlocks::Next(Block& block)
{
    if (!fSource.Next(block))
        return false;
    for (std::size_t i = 0; i < fFields.size(); ++i)
    {
        const double* const values = block.GetField(i);
        if (fFields[i].use == Field::Use::kCategory)
            fFields[i].numCoded +=
                std::count_if(values, values + block.numRows, [](double code) { return code >= 0.0; });
    }
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

LibraryBlocks::LibraryBlocks(BlockSource& source, const std::vector<Field>& fields, const WeightTally& tally)
    : fSource(source), fFields(fields), fWeightGrid(tally), fValues(fields.size())
{
}

bool LibraryBlocks::Next(Block& block)
{
    if (!fSource.Next(block))
        return false;
    for (std::size_t i = 0; i < fFields.size(); ++i)
    {
        if (fFields[i].use == Field::Use::kWeight)
            ConvertWeights(block.GetField(i), block.numRows);
        else if (fFields[i].use == Field::Use::kAttribute)
            ConvertValues(fFields[i], fValues[i], block.GetField(i), block.numRows);
        else if (fFields[i].use == Field::Use::kCategory)
            ConvertCodes(fFields[i], block.GetField(i), block.numRows);
    }
    return true;
}

std::optional<std::int64_t> LibraryBlocks::GetNumWithoutWeight() const
{
    return FindWeight(fFields) ? std::optional(fNumWithoutWeight) : std::nullopt;
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
