#ifndef MCBINNING_COLUMNREADER_H
#define MCBINNING_COLUMNREADER_H

#include "hosts/python/src/columntype.h"

#include <mcobnqrt/mccommon.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string_view>

/// The number, or the next one if it is gMissingValue itself, the most negative of all doubles.
inline double TellFromMissing(double number)
{
    constexpr double kNextToMissing = -1.7976931348623155e308;
    return number == MCMV::gMissingValue ? kNextToMissing : number;
}

/// The numbers of one column of one batch, read where they lie. Borrows the memory of the batch.
class ColumnReader
{
public:
    virtual ~ColumnReader() = default;

    /// Writes the values of the rows from `first` on to `values`, gMissingValue where there is none. A NaN stays one. All
    /// others are told from gMissingValue.
    virtual void Read(std::size_t first, std::size_t count, double* values) const = 0;
};

/// The texts of one column of one batch, read where they lie. Borrows the memory of the batch.
class TextReader
{
public:
    TextReader(const ArrowArray& array, ColumnType::Storage storage, std::int64_t offset);

    /// Nothing where there is no value.
    std::optional<std::string_view> At(std::size_t row) const;

private:
    std::string_view ViewAt(std::size_t index) const;

    const ArrowArray& fArray;
    ColumnType::Storage fStorage;
    std::size_t fOffset;
};

/// A one-dimensional array of numbers in the memory of somebody else. The stride is in bytes, and may be 0 or negative.
struct StridedArray
{
    const void* data;
    std::ptrdiff_t stride;
    std::size_t length;
    ColumnType::Storage storage;
};

std::unique_ptr<ColumnReader> MakeReader(const StridedArray& array);

/// Reads the numbers of `array`, which are not those of a text type, from `offset` rows behind its own beginning.
std::unique_ptr<ColumnReader> MakeReader(const ArrowArray& array, const ColumnType& type, std::int64_t offset);

/// Reads not the values of a dictionary's column but their indices in the dictionary.
std::unique_ptr<ColumnReader> MakeIndexReader(const ArrowArray& array, const ColumnType& type, std::int64_t offset);

/// The number as an index of a dictionary of `size` values. \throw DataFault if it has none there: not every producer
/// looks.
std::size_t CheckIndex(double index, std::size_t size);

#endif
