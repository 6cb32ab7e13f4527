#ifndef MCBINNING_BLOCKS_H
#define MCBINNING_BLOCKS_H

#include <cstddef>
#include <vector>

/// Some records, field by field: small enough to stay in the cache between conversion and use.
class Block
{
public:
    static constexpr std::size_t kMaxRows = 1024;

    explicit Block(std::size_t numFields) : fValues(numFields * kMaxRows) {}

    double* GetField(std::size_t field) { return fValues.data() + field * kMaxRows; }
    double At(std::size_t field, std::size_t row) const { return fValues[field * kMaxRows + row]; }

    std::size_t numRows = 0;

private:
    std::vector<double> fValues;
};

/// The records of the data in blocks, in their order, with categories as codes.
class BlockSource
{
public:
    virtual ~BlockSource() = default;

    /// Fills the block. False at the end, and then the block has no rows.
    virtual bool Next(Block& block) = 0;
};

#endif
