#include "hosts/python/src/columnreader.h"

#include "hosts/python/src/faults.h"

#include <mcobnqrt/mccommon.h>

#include <cmath>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

namespace
{

using MCMV::gMissingValue;
using Storage = ColumnType::Storage;

bool TestBit(const void* bits, std::size_t index)
{
    return (static_cast<const std::uint8_t*>(bits)[index / 8] >> (index % 8) & 1) != 0;
}

struct Half
{
    std::uint16_t bits;
};

__extension__ using Int128 = __int128;

template<class Number>
double ToDouble(Number number)
{
    return static_cast<double>(number);
}

double ToDouble(double number)
{
    return TellFromMissing(number);
}

double ToDouble(Half number)
{
    const int exponent = number.bits >> 10 & 0x1F;
    const int fraction = number.bits & 0x3FF;
    double value = exponent == 0 ? std::ldexp(fraction, -24) : std::ldexp(fraction + 1024, exponent - 25);
    if (exponent == 0x1F)
        value = fraction == 0 ? HUGE_VAL : std::nan("");
    return number.bits >> 15 != 0 ? -value : value;
}

/// A bitmap with a bit for each value, set where there is one; null if there are all.
struct Validity
{
    const void* bits = nullptr;
    std::size_t offset = 0;
};

/// Numbers of one type at a fixed distance.
template<class Number>
class NumberReader : public ColumnReader
{
public:
    NumberReader(const void* data, std::ptrdiff_t stride, Validity validity, double factor, double divisor)
        : fData(static_cast<const char*>(data)), fStride(stride), fValidity(validity), fFactor(factor),
          fDivisor(divisor)
    {
    }

    void Read(std::size_t first, std::size_t count, double* values) const override
    {
        const char* source = fData + static_cast<std::ptrdiff_t>(first) * fStride;
        for (std::size_t i = 0; i < count; ++i, source += fStride)
        {
            Number number;
            std::memcpy(&number, source, sizeof(number)); // a field of a NumPy record need not be aligned
            values[i] = ToDouble(number);
        }
        Scale(values, count);
        if (fValidity.bits == nullptr)
            return;
        for (std::size_t i = 0; i < count; ++i)
        {
            if (!TestBit(fValidity.bits, fValidity.offset + first + i))
                values[i] = gMissingValue;
        }
    }

private:
    /// One of the two is 1, and each is done on its own, so that a decimal 0.1 becomes the double 0.1.
    void Scale(double* values, std::size_t count) const
    {
        if (fFactor != 1.0)
        {
            for (std::size_t i = 0; i < count; ++i) values[i] *= fFactor;
        }
        if (fDivisor != 1.0)
        {
            for (std::size_t i = 0; i < count; ++i) values[i] /= fDivisor;
        }
    }

    const char* fData;
    std::ptrdiff_t fStride;
    Validity fValidity;
    double fFactor;
    double fDivisor;
};

class BitReader : public ColumnReader
{
public:
    BitReader(const void* bits, std::size_t offset, Validity validity)
        : fBits(bits), fOffset(offset), fValidity(validity)
    {
    }

    void Read(std::size_t first, std::size_t count, double* values) const override
    {
        for (std::size_t i = 0; i < count; ++i)
        {
            const bool isValid = fValidity.bits == nullptr || TestBit(fValidity.bits, fValidity.offset + first + i);
            values[i] = !isValid ? gMissingValue : TestBit(fBits, fOffset + first + i) ? 1.0 : 0.0;
        }
    }

private:
    const void* fBits;
    std::size_t fOffset;
    Validity fValidity;
};

class NullReader : public ColumnReader
{
public:
    void Read(std::size_t, std::size_t count, double* values) const override
    {
        for (std::size_t i = 0; i < count; ++i) values[i] = gMissingValue;
    }
};

/// The numbers that the first index of a dictionary picks, and so on.
class DictionaryReader : public ColumnReader
{
public:
    DictionaryReader(std::unique_ptr<ColumnReader> indices, const ColumnReader& values, std::size_t size)
        : fIndices(std::move(indices)), fValues(size)
    {
        values.Read(0, size, fValues.data());
    }

    void Read(std::size_t first, std::size_t count, double* values) const override
    {
        fIndices->Read(first, count, values);
        for (std::size_t i = 0; i < count; ++i)
        {
            if (values[i] != gMissingValue)
                values[i] = fValues[CheckIndex(values[i], fValues.size())];
        }
    }

private:
    std::unique_ptr<ColumnReader> fIndices;
    std::vector<double> fValues;
};

/// Calls `make` with a number of the type that is stored. Null if that is no number.
template<class Make>
std::unique_ptr<ColumnReader> MakeForType(Storage storage, Make make)
{
    // NOLINTBEGIN(bugprone-branch-clone): the branches differ in a type, which is not looked at in a template
    switch (storage)
    {
    case Storage::kInt8:
        return make(std::int8_t());
    case Storage::kInt16:
        return make(std::int16_t());
    case Storage::kInt32:
        return make(std::int32_t());
    case Storage::kInt64:
        return make(std::int64_t());
    case Storage::kUint8:
        return make(std::uint8_t());
    case Storage::kUint16:
        return make(std::uint16_t());
    case Storage::kUint32:
        return make(std::uint32_t());
    case Storage::kUint64:
        return make(std::uint64_t());
    case Storage::kHalf:
        return make(Half());
    case Storage::kFloat:
        return make(float());
    case Storage::kDouble:
        return make(double());
    case Storage::kDecimal128:
        return make(Int128());
    case Storage::kNone:
    case Storage::kNull:
    case Storage::kBit:
    case Storage::kText:
    case Storage::kLargeText:
    case Storage::kTextView:
        break;
    }
    // NOLINTEND(bugprone-branch-clone)
    return nullptr;
}

std::unique_ptr<ColumnReader> MakePlainReader(const ArrowArray& array, Storage storage, double factor, double divisor,
                                              std::int64_t offset)
{
    if (storage == Storage::kNull)
        return std::make_unique<NullReader>();
    const auto first = static_cast<std::size_t>(array.offset + offset);
    const Validity validity{array.null_count == 0 ? nullptr : array.buffers[0], first};
    if (storage == Storage::kBit)
        return std::make_unique<BitReader>(array.buffers[1], first, validity);
    return MakeForType(storage,
                       [&](auto number) -> std::unique_ptr<ColumnReader>
                       {
                           using Number = decltype(number);
                           const char* const data = static_cast<const char*>(array.buffers[1]) + first * sizeof(Number);
                           return std::make_unique<NumberReader<Number>>(data, sizeof(Number), validity, factor,
                                                                         divisor);
                       });
}

} // namespace

TextReader::TextReader(const ArrowArray& array, Storage storage, std::int64_t offset)
    : fArray(array), fStorage(storage), fOffset(static_cast<std::size_t>(array.offset + offset))
{
}

std::optional<std::string_view> TextReader::At(std::size_t row) const
{
    const std::size_t index = fOffset + row;
    if (fArray.buffers[0] != nullptr && fArray.null_count != 0 && !TestBit(fArray.buffers[0], index))
        return std::nullopt;
    return ViewAt(index);
}

std::string_view TextReader::ViewAt(std::size_t index) const
{
    if (fStorage == Storage::kTextView)
    {
        // 16 bytes: the length, and then the text itself if it has at most 12 bytes, else its first four, the number of
        // its buffer and its position there.
        const char* const view = static_cast<const char*>(fArray.buffers[1]) + 16 * index;
        std::int32_t parts[4];
        std::memcpy(parts, view, sizeof(parts));
        const auto size = static_cast<std::size_t>(parts[0]);
        return size <= 12 ? std::string_view(view + 4, size)
                          : std::string_view(static_cast<const char*>(fArray.buffers[2 + parts[2]]) + parts[3], size);
    }
    const char* const text = static_cast<const char*>(fArray.buffers[2]);
    if (fStorage == Storage::kLargeText)
    {
        const auto* const ends = static_cast<const std::int64_t*>(fArray.buffers[1]) + index;
        return std::string_view(text + ends[0], static_cast<std::size_t>(ends[1] - ends[0]));
    }
    const auto* const ends = static_cast<const std::int32_t*>(fArray.buffers[1]) + index;
    return std::string_view(text + ends[0], static_cast<std::size_t>(ends[1] - ends[0]));
}

std::unique_ptr<ColumnReader> MakeReader(const StridedArray& array)
{
    return MakeForType(array.storage,
                       [&](auto number) -> std::unique_ptr<ColumnReader>
                       {
                           using Number = decltype(number);
                           return std::make_unique<NumberReader<Number>>(array.data, array.stride, Validity(), 1.0,
                                                                         1.0);
                       });
}

std::unique_ptr<ColumnReader> MakeReader(const ArrowArray& array, const ColumnType& type, std::int64_t offset)
{
    if (!type.isDictionary)
        return MakePlainReader(array, type.storage, type.factor, type.divisor, offset);
    const ArrowArray& dictionary = *array.dictionary;
    return std::make_unique<DictionaryReader>(MakeIndexReader(array, type, offset),
                                              *MakePlainReader(dictionary, type.storage, type.factor, type.divisor, 0),
                                              static_cast<std::size_t>(dictionary.length));
}

std::unique_ptr<ColumnReader> MakeIndexReader(const ArrowArray& array, const ColumnType& type, std::int64_t offset)
{
    return MakePlainReader(array, type.indexStorage, 1.0, 1.0, offset);
}

std::size_t CheckIndex(double index, std::size_t size)
{
    if (!(index >= 0.0 && index < static_cast<double>(size)))
        throw DataFault("an index points outside of its dictionary of " + std::to_string(size) + " values");
    return static_cast<std::size_t>(index);
}
