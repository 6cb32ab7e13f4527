#ifndef MCBINNING_TABLEBLOCKS_H
#define MCBINNING_TABLEBLOCKS_H

#include "hosts/python/src/batches.h"
#include "hosts/python/src/blocks.h"
#include "hosts/python/src/columntype.h"
#include "hosts/python/src/field.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

/// The values of one field in the rows at hand, in the form that a record takes.
class FieldReader
{
public:
    virtual ~FieldReader() = default;

    /// `row` is the row's number in the whole data, for messages.
    virtual void Read(std::size_t first, std::size_t count, std::int64_t row, double* values) = 0;
};

/// Reads batches and arrays side by side, where they lie. Codes of categories come in the order of arrival, behind
/// those that the fields know.
class TableBlocks : public BlockSource
{
public:
    /// Without `batches` all fields have arrays. The fields stay the caller's and learn their categories here.
    /// \throw DataFault if a column's type is not one for its use, or the arrays are of different lengths.
    TableBlocks(Batches* batches, std::vector<Field>& fields);

    /// \throw DataFault if a value can't be used, or the batches have more or fewer rows than the arrays.
    bool Next(Block& block) override;

private:
    bool NextBatch();
    void OpenBatch(const ArrowArray* batch);
    std::unique_ptr<FieldReader> MakeFieldReader(std::size_t index, const ArrowArray* batch);

    Batches* fBatches;
    std::vector<Field>& fFields;
    std::vector<ColumnType> fTypes; ///< by field; of those with a column
    std::vector<std::unique_ptr<FieldReader>> fReaders;
    std::int64_t fNumArrayRows = -1; ///< -1 without arrays
    std::int64_t fFirstRow = 0;      ///< of the batch, in the whole data
    std::int64_t fNumRows = 0;       ///< of the batch
    std::int64_t fNextRow = 0;       ///< in the batch
    bool fIsAtEnd = false;
};

#endif
