#ifndef MCBINNING_LIBRARYBLOCKS_H
#define MCBINNING_LIBRARYBLOCKS_H

#include "bins/infinitevalues.h"
#include "bins/weightgrid.h"
#include "hosts/python/src/blocks.h"
#include "hosts/python/src/field.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

/// The index of the weight, if there is one.
std::optional<std::size_t> FindWeight(const std::vector<Field>& fields);

/// Passes blocks on as they are, tallies their weights, and counts the records that have a category.
class TalliedBlocks : public BlockSource
{
public:
    /// Both stay the caller's; the counts go to the fields.
    TalliedBlocks(BlockSource& source, std::vector<Field>& fields);

    bool Next(Block& block) override;

    const WeightTally& GetTally() const { return fTally; }

private:
    BlockSource& fSource;
    std::vector<Field>& fFields;
    std::optional<std::size_t> fWeight;
    WeightTally fTally;
};

/// Passes blocks on in the form that the library takes: with weights on their grid, with stand-ins for infinite values,
/// with all that is declared missing as gMissingValue, and with the codes that the library takes.
class LibraryBlocks : public BlockSource
{
public:
    /// `tally` is of all weights that will come. The others stay the caller's.
    LibraryBlocks(BlockSource& source, const std::vector<Field>& fields, const WeightTally& tally);

    bool Next(Block& block) override;

    const WeightGrid& GetWeightGrid() const { return fWeightGrid; }

    /// How many records had no weight; nothing if no field holds weights.
    std::optional<std::int64_t> GetNumWithoutWeight() const;

    /// The values that have passed, by field.
    const std::vector<InfiniteValues>& GetValues() const { return fValues; }

private:
    void ConvertWeights(double* weights, std::size_t count);

    BlockSource& fSource;
    const std::vector<Field>& fFields;
    WeightGrid fWeightGrid;
    std::int64_t fNumWithoutWeight = 0;
    std::vector<InfiniteValues> fValues;
};

#endif
