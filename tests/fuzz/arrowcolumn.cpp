#include "tests/fuzz/arrowcolumn.h"

#include <mcobnqrt/mccommon.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <map>
#include <utility>

namespace
{

__extension__ using Int128 = __int128;

template<class Number>
std::vector<std::uint8_t> BytesOf(const Number& number)
{
    std::vector<std::uint8_t> bytes(sizeof(number));
    std::memcpy(bytes.data(), &number, sizeof(number));
    return bytes;
}

std::string WriteDown(Int128 number)
{
    std::string digits;
    for (Int128 rest = number; rest != 0 || digits.empty(); rest /= 10)
        digits.insert(digits.begin(), static_cast<char>('0' + std::abs(static_cast<int>(rest % 10))));
    return number < 0 ? "-" + digits : digits;
}

/// The number times ten to the power of `exponent`. It is the nearest double if the stored number and the power are
/// doubles, which are then put together in one step.
PlainValue Scaled(Int128 number, int exponent)
{
    constexpr Int128 kMostExact = Int128(1) << 53;
    PlainValue plain;
    plain.number = std::strtod((WriteDown(number) + "e" + std::to_string(exponent)).c_str(), nullptr);
    plain.isExact = number <= kMostExact && number >= -kMostExact && exponent >= -22 && exponent <= 22;
    return plain;
}

template<class Number>
StoredValue MakeInteger(FuzzedDataProvider& input, int exponent = 0)
{
    const Number number = input.ConsumeBool() ? static_cast<Number>(input.ConsumeIntegral<std::int8_t>())
                                              : input.ConsumeIntegral<Number>();
    return {Scaled(number, exponent), BytesOf(number)};
}

StoredValue MakeInt128(FuzzedDataProvider& input, int exponent)
{
    if (input.ConsumeBool())
    {
        const Int128 number = input.ConsumeIntegral<std::int32_t>();
        return {Scaled(number, exponent), BytesOf(number)};
    }
    const Int128 high = input.ConsumeIntegral<std::int64_t>();
    const Int128 number = high * (Int128(1) << 60) + input.ConsumeIntegral<std::int32_t>();
    return {Scaled(number, exponent), BytesOf(number)};
}

template<class Number>
StoredValue MakeFloat(FuzzedDataProvider& input)
{
    static const Number kSpecial[] = {0,
                                      -Number(0),
                                      std::numeric_limits<Number>::infinity(),
                                      -std::numeric_limits<Number>::infinity(),
                                      std::numeric_limits<Number>::quiet_NaN(),
                                      std::numeric_limits<Number>::denorm_min(),
                                      std::numeric_limits<Number>::lowest()};
    const Number number = input.ConsumeBool() ? input.PickValueInArray(kSpecial)
                                              : static_cast<Number>(input.ConsumeIntegralInRange(-20, 200)) / 4;
    PlainValue plain;
    plain.number = number;
    if (plain.number == MCMV::gMissingValue) // a value all the same, and so told apart from a missing one
        plain.number = std::nextafter(plain.number, 0.0);
    return {plain, BytesOf(number)};
}

/// One sign bit, 5 of the exponent, 10 of the fraction.
StoredValue MakeHalf(FuzzedDataProvider& input)
{
    const auto bits = input.ConsumeIntegral<std::uint16_t>();
    const int exponent = bits / 1024 % 32;
    const double fraction = bits % 1024 / 1024.0;
    double value = exponent == 0 ? fraction * std::exp2(-14) : (1 + fraction) * std::exp2(exponent - 15);
    if (exponent == 31)
        value = fraction == 0.0 ? std::numeric_limits<double>::infinity() : std::numeric_limits<double>::quiet_NaN();
    PlainValue plain;
    plain.number = bits >= 0x8000 ? -value : value;
    return {plain, BytesOf(bits)};
}

StoredValue MakeMilliseconds(FuzzedDataProvider& input)
{
    const auto number = input.ConsumeIntegral<std::int64_t>();
    PlainValue plain;
    plain.number = static_cast<double>(static_cast<long double>(number) / (24 * 60 * 60 * 1000));
    plain.isExact = false;
    return {plain, BytesOf(number)};
}

StoredValue MakeDecimal(FuzzedDataProvider& input, const std::string& format)
{
    int precision = 0;
    int scale = 0;
    int bits = 128;
    std::sscanf(format.c_str(), "d:%d,%d,%d", &precision, &scale, &bits);
    if (bits == 32)
        return MakeInteger<std::int32_t>(input, -scale);
    if (bits == 64)
        return MakeInteger<std::int64_t>(input, -scale);
    return MakeInt128(input, -scale);
}

StoredValue MakeText(FuzzedDataProvider& input)
{
    static const char* const kTexts[] = {"", "a", "b", "twelve bytes", "more than twelve bytes", "more than that, too"};
    StoredValue value;
    value.plain.text = input.ConsumeBool() ? input.PickValueInArray(kTexts) : input.ConsumeRandomLengthString(30);
    return value;
}

StoredValue MakeBit(FuzzedDataProvider& input)
{
    StoredValue value;
    value.plain.number = input.ConsumeBool() ? 1.0 : 0.0;
    return value;
}

StoredValue MakeNull(FuzzedDataProvider&)
{
    StoredValue value;
    value.plain.isMissing = true;
    return value;
}

void SetBit(std::vector<std::uint8_t>& bits, std::size_t index)
{
    bits[index / 8] = static_cast<std::uint8_t>(bits[index / 8] | 1U << (index % 8));
}

/// What is left of the input decides; not more than a byte for each eight values, so that arrays can be long.
class Chooser
{
public:
    explicit Chooser(FuzzedDataProvider& input) : fState(input.ConsumeIntegral<std::uint32_t>()) {}

    std::size_t Below(std::size_t limit)
    {
        fState = fState * 1664525U + 1013904223U;
        return (fState >> 8) % limit;
    }

private:
    std::uint32_t fState;
};

} // namespace

ValueMaker::ValueMaker(std::string format) : fFormat(std::move(format)) {}

std::size_t ValueMaker::GetSize() const
{
    static const std::map<char, std::size_t> kSizes{{'c', 1}, {'C', 1}, {'s', 2}, {'S', 2}, {'i', 4}, {'I', 4},
                                                    {'l', 8}, {'L', 8}, {'e', 2}, {'f', 4}, {'g', 8}};
    if (fFormat[0] == 't')
        return fFormat == "tdD" ? 4 : 8;
    if (fFormat[0] == 'd')
        return fFormat.find(",32") != std::string::npos ? 4 : fFormat.find(",64") != std::string::npos ? 8 : 16;
    const auto found = kSizes.find(fFormat[0]);
    return found == kSizes.end() ? 0 : found->second;
}

StoredValue ValueMaker::Make(FuzzedDataProvider& input) const
{
    using Maker = StoredValue (*)(FuzzedDataProvider&);
    static const std::map<std::string, Maker> kMakers{
        {"n", MakeNull},
        {"b", MakeBit},
        {"c", [](FuzzedDataProvider& in) { return MakeInteger<std::int8_t>(in); }},
        {"C", [](FuzzedDataProvider& in) { return MakeInteger<std::uint8_t>(in); }},
        {"s", [](FuzzedDataProvider& in) { return MakeInteger<std::int16_t>(in); }},
        {"S", [](FuzzedDataProvider& in) { return MakeInteger<std::uint16_t>(in); }},
        {"i", [](FuzzedDataProvider& in) { return MakeInteger<std::int32_t>(in); }},
        {"I", [](FuzzedDataProvider& in) { return MakeInteger<std::uint32_t>(in); }},
        {"l", [](FuzzedDataProvider& in) { return MakeInteger<std::int64_t>(in); }},
        {"L", [](FuzzedDataProvider& in) { return MakeInteger<std::uint64_t>(in); }},
        {"e", MakeHalf},
        {"f", MakeFloat<float>},
        {"g", MakeFloat<double>},
        {"tdD", [](FuzzedDataProvider& in) { return MakeInteger<std::int32_t>(in); }},
        {"tdm", MakeMilliseconds},
        {"tss:", [](FuzzedDataProvider& in) { return MakeInteger<std::int64_t>(in, 6); }},
        {"tsm:UTC", [](FuzzedDataProvider& in) { return MakeInteger<std::int64_t>(in, 3); }},
        {"tsu:Europe/Berlin", [](FuzzedDataProvider& in) { return MakeInteger<std::int64_t>(in); }},
        {"tsn:", [](FuzzedDataProvider& in) { return MakeInteger<std::int64_t>(in, -3); }},
    };
    if (IsText())
        return MakeText(input);
    const auto found = kMakers.find(fFormat);
    return found != kMakers.end() ? found->second(input) : MakeDecimal(input, fFormat);
}

void PlainArray::Make(FuzzedDataProvider& input, const ValueMaker& maker, std::size_t offset, std::size_t length)
{
    std::vector<StoredValue> pool(input.ConsumeIntegralInRange<std::size_t>(1, 12));
    for (StoredValue& value : pool) value = maker.Make(input);
    Fill(input, maker, pool, offset, length);
}

void PlainArray::MakeIndices(FuzzedDataProvider& input, const ValueMaker& maker, std::size_t offset, std::size_t length,
                             std::size_t size)
{
    std::vector<StoredValue> pool;
    for (std::size_t index = 0; index < size; ++index)
    {
        StoredValue value;
        value.plain.number = static_cast<double>(index);
        value.bytes = BytesOf(static_cast<std::uint64_t>(index)); // its first bytes stand for the smaller types
        value.bytes.resize(maker.GetSize());
        pool.push_back(value);
    }
    if (input.ConsumeIntegralInRange(0, 15) == 0)
    {
        StoredValue value;
        value.plain.isBad = true;
        value.bytes.assign(maker.GetSize(), input.ConsumeBool() ? 0xFF : 0x7F); // the one is -1 if there is a sign
        pool.push_back(value);
    }
    Fill(input, maker, pool, offset, length);
}

void PlainArray::Fill(FuzzedDataProvider& input, const ValueMaker& maker, const std::vector<StoredValue>& pool,
                      std::size_t offset, std::size_t length)
{
    Chooser chooser(input);
    const auto nullShare = input.ConsumeIntegralInRange<std::size_t>(0, 4);
    std::vector<const StoredValue*> slots;
    std::vector<bool> isValid;
    for (std::size_t i = 0; i < offset + length; ++i)
    {
        slots.push_back(&pool[chooser.Below(pool.size())]);
        isValid.push_back(maker.IsNull() || chooser.Below(8) >= nullShare);
        if (i < offset)
            continue;
        values.push_back(slots.back()->plain);
        values.back().isMissing = values.back().isMissing || !isValid.back();
    }
    array.length = static_cast<std::int64_t>(length);
    array.offset = static_cast<std::int64_t>(offset);
    if (maker.IsNull())
        array.null_count = array.length; // and no buffer at all
    else
    {
        AddValidity(input, isValid, offset);
        if (maker.GetFormat() == "u")
            AddTexts<std::int32_t>(slots);
        else if (maker.GetFormat() == "U")
            AddTexts<std::int64_t>(slots);
        else if (maker.IsText())
            AddTextViews(slots);
        else
            AddFixed(maker, slots);
    }
    array.n_buffers = static_cast<std::int64_t>(fPointers.size());
    array.buffers = fPointers.data();
}

/// A producer may leave out the bits where all values are there, and needn't count.
void PlainArray::AddValidity(FuzzedDataProvider& input, const std::vector<bool>& isValid, std::size_t offset)
{
    std::vector<std::uint8_t> bits(isValid.size() / 8 + 1);
    for (std::size_t i = 0; i < isValid.size(); ++i)
    {
        if (isValid[i])
            SetBit(bits, i);
    }
    bits.resize((isValid.size() + 7) / 8);
    const auto numNulls = std::count(isValid.begin() + static_cast<std::ptrdiff_t>(offset), isValid.end(), false);
    array.null_count = input.ConsumeBool() ? numNulls : -1;
    const bool areAllThere = std::count(isValid.begin(), isValid.end(), false) == 0;
    AddBuffer(areAllThere && input.ConsumeBool() ? std::vector<std::uint8_t>() : bits);
}

void PlainArray::AddFixed(const ValueMaker& maker, const std::vector<const StoredValue*>& slots)
{
    std::vector<std::uint8_t> bytes;
    if (maker.IsBit())
    {
        bytes.resize((slots.size() + 7) / 8);
        for (std::size_t i = 0; i < slots.size(); ++i)
        {
            if (slots[i]->plain.number != 0.0)
                SetBit(bytes, i);
        }
    }
    else
    {
        for (const StoredValue* const slot : slots) bytes.insert(bytes.end(), slot->bytes.begin(), slot->bytes.end());
    }
    AddBuffer(bytes);
}

/// The ends of the texts, and the texts. They needn't begin at the beginning of the buffer.
template<class Offset>
void PlainArray::AddTexts(const std::vector<const StoredValue*>& slots)
{
    std::vector<std::uint8_t> ends;
    std::vector<std::uint8_t> texts{'.', '.'};
    const auto addEnd = [&]
    {
        const std::vector<std::uint8_t> bytes = BytesOf(static_cast<Offset>(texts.size()));
        ends.insert(ends.end(), bytes.begin(), bytes.end());
    };
    addEnd();
    for (const StoredValue* const slot : slots)
    {
        texts.insert(texts.end(), slot->plain.text.begin(), slot->plain.text.end());
        addEnd();
    }
    AddBuffer(ends);
    AddBuffer(texts);
}

/// Texts of at most 12 bytes stand in their view; of the others every second one is in a second buffer. A last buffer
/// holds the sizes of these.
void PlainArray::AddTextViews(const std::vector<const StoredValue*>& slots)
{
    std::vector<std::uint8_t> views;
    std::vector<std::uint8_t> texts[2];
    std::size_t numLong = 0;
    for (const StoredValue* const slot : slots)
    {
        const std::string& text = slot->plain.text;
        std::uint8_t view[16] = {};
        const auto size = static_cast<std::int32_t>(text.size());
        std::memcpy(view, &size, 4);
        std::memcpy(view + 4, text.data(), std::min<std::size_t>(text.size(), text.size() <= 12 ? 12 : 4));
        if (text.size() > 12)
        {
            const auto buffer = static_cast<std::int32_t>(numLong++ % 2);
            const auto position = static_cast<std::int32_t>(texts[buffer].size());
            std::memcpy(view + 8, &buffer, 4);
            std::memcpy(view + 12, &position, 4);
            texts[buffer].insert(texts[buffer].end(), text.begin(), text.end());
        }
        views.insert(views.end(), view, view + sizeof(view));
    }
    AddBuffer(views);
    std::vector<std::uint8_t> sizes;
    for (const std::vector<std::uint8_t>& buffer : texts)
    {
        AddBuffer(buffer);
        const std::vector<std::uint8_t> bytes = BytesOf(static_cast<std::int64_t>(buffer.size()));
        sizes.insert(sizes.end(), bytes.begin(), bytes.end());
    }
    AddBuffer(sizes);
}

/// A buffer without bytes is null, as it may be.
void PlainArray::AddBuffer(const std::vector<std::uint8_t>& bytes)
{
    fBuffers.push_back(bytes.empty() ? nullptr : std::make_unique<std::uint8_t[]>(bytes.size()));
    std::copy(bytes.begin(), bytes.end(), fBuffers.back().get());
    fPointers.push_back(fBuffers.back().get());
}
