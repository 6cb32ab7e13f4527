#ifndef MCOBNQRT_TESTS_FUZZ_ARROWCOLUMN_H
#define MCOBNQRT_TESTS_FUZZ_ARROWCOLUMN_H

#include "hosts/python/src/arrowabi.h"

#include <fuzzer/FuzzedDataProvider.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

/// One value as a person would write down what the column holds.
struct PlainValue
{
    bool isMissing = false;
    double number = 0.0;
    bool isExact = true; ///< or the last bits of `number` depend on how it is worked out
    bool isBad = false;  ///< an index that its dictionary doesn't have
    std::string text;    ///< of a column of texts
};

/// A value and how it is stored. A text is stored by the array.
struct StoredValue
{
    PlainValue plain;
    std::vector<std::uint8_t> bytes;
};

/// Makes values of one format of the Arrow C data interface.
class ValueMaker
{
public:
    explicit ValueMaker(std::string format);

    const std::string& GetFormat() const { return fFormat; }
    bool IsText() const { return fFormat == "u" || fFormat == "U" || fFormat == "vu"; }
    bool IsBit() const { return fFormat == "b"; }
    bool IsNull() const { return fFormat == "n"; }
    /// Of a stored value; 0 where there is none of a fixed size.
    std::size_t GetSize() const;
    /// A stored number is one times a power of ten, and so its last bits may not be exact.
    bool IsScaled() const { return fFormat[0] == 'd' || fFormat[0] == 't'; }

    StoredValue Make(FuzzedDataProvider& input) const;

private:
    std::string fFormat;
};

/// An array of the C data interface and what it holds. Each of its buffers ends where the format says that it ends, so
/// that a sanitizer sees every byte that is read behind it.
class PlainArray
{
public:
    PlainArray() = default;
    PlainArray(PlainArray&&) = delete;
    ~PlainArray() = default;

    /// Makes `length` values behind `offset` others that nobody should look at.
    void Make(FuzzedDataProvider& input, const ValueMaker& maker, std::size_t offset, std::size_t length);

    /// Makes indices into a dictionary of `size` values, and now and then one that is out of range.
    void MakeIndices(FuzzedDataProvider& input, const ValueMaker& maker, std::size_t offset, std::size_t length,
                     std::size_t size);

    ArrowArray array{};
    std::vector<PlainValue> values; ///< without the others

private:
    void Fill(FuzzedDataProvider& input, const ValueMaker& maker, const std::vector<StoredValue>& pool,
              std::size_t offset, std::size_t length);
    void AddValidity(FuzzedDataProvider& input, const std::vector<bool>& isValid, std::size_t offset);
    void AddFixed(const ValueMaker& maker, const std::vector<const StoredValue*>& slots);
    template<class Offset>
    void AddTexts(const std::vector<const StoredValue*>& slots);
    void AddTextViews(const std::vector<const StoredValue*>& slots);
    void AddBuffer(const std::vector<std::uint8_t>& bytes);

    std::vector<std::unique_ptr<std::uint8_t[]>> fBuffers;
    std::vector<const void*> fPointers;
};

#endif
