#include "hosts/python/src/columntype.h"

#include <charconv>
#include <cmath>
#include <map>
#include <string_view>
#include <utility>

namespace
{

using Storage = ColumnType::Storage;

/// The flag of a schema whose dictionary is ordered, as the Arrow C data interface defines it.
constexpr std::int64_t kDictionaryOrdered = 1;

bool StartsWith(std::string_view text, std::string_view prefix)
{
    return text.substr(0, prefix.size()) == prefix;
}

ColumnType Plain(Storage storage, const char* kind)
{
    ColumnType type;
    type.storage = storage;
    type.kind = kind;
    return type;
}

/// "tsu:Europe/Berlin": seconds, milli-, micro- or nanoseconds since the epoch, as microseconds. Those are exact in a
/// double until the year 2255, while nanoseconds would lose their last digits today.
ColumnType Timestamp(std::string_view format)
{
    ColumnType type = Plain(Storage::kInt64, "timestamp");
    switch (format[2])
    {
    case 's':
        type.factor = 1e6;
        break;
    case 'm':
        type.factor = 1e3;
        break;
    case 'n':
        type.divisor = 1e3;
        break;
    default:
        break;
    }
    type.timeZone = format.substr(4);
    return type;
}

/// Reads a number off the front of the text, with a comma behind it. -1 if there is none.
int TakeNumber(std::string_view& text)
{
    int number = -1;
    const char* const end = text.data() + text.size();
    const std::from_chars_result result = std::from_chars(text.data(), end, number);
    text.remove_prefix(static_cast<std::size_t>(result.ptr - text.data()));
    if (!text.empty())
        text.remove_prefix(1);
    return number;
}

/// "d:18,3" has 18 digits, 3 of them behind the point, and 128 bits unless a third number says otherwise.
ColumnType Decimal(std::string_view format)
{
    static const std::map<int, Storage> kStorages{
        {32, Storage::kInt32}, {64, Storage::kInt64}, {128, Storage::kDecimal128}};
    std::string_view rest = format.substr(2);
    TakeNumber(rest);
    const int scale = TakeNumber(rest);
    const auto storage = kStorages.find(rest.empty() ? 128 : TakeNumber(rest));
    if (storage == kStorages.end())
        return Plain(Storage::kNone, "decimal of more than 128 bits");
    ColumnType type = Plain(storage->second, "decimal");
    type.divisor = std::pow(10.0, scale);
    return type;
}

/// What a type that can't be binned is to a user.
const char* NameUnusable(std::string_view format)
{
    static constexpr std::pair<std::string_view, const char*> kNames[] = {
        {"+r", "run-end encoded"}, {"+", "nested"}, {"tt", "time of day"}, {"tD", "duration"}, {"ti", "interval"},
        {"z", "binary"},           {"Z", "binary"}, {"vz", "binary"},      {"w", "binary"},
    };
    for (const auto& [prefix, name] : kNames)
    {
        if (StartsWith(format, prefix))
            return name;
    }
    return "unknown";
}

ColumnType FromFormat(std::string_view format)
{
    static const std::map<std::string_view, ColumnType> kTypes{
        {"n", Plain(Storage::kNull, "null")},      {"b", Plain(Storage::kBit, "boolean")},
        {"c", Plain(Storage::kInt8, "integer")},   {"C", Plain(Storage::kUint8, "integer")},
        {"s", Plain(Storage::kInt16, "integer")},  {"S", Plain(Storage::kUint16, "integer")},
        {"i", Plain(Storage::kInt32, "integer")},  {"I", Plain(Storage::kUint32, "integer")},
        {"l", Plain(Storage::kInt64, "integer")},  {"L", Plain(Storage::kUint64, "integer")},
        {"e", Plain(Storage::kHalf, "float")},     {"f", Plain(Storage::kFloat, "float")},
        {"g", Plain(Storage::kDouble, "float")},   {"u", Plain(Storage::kText, "text")},
        {"U", Plain(Storage::kLargeText, "text")}, {"vu", Plain(Storage::kTextView, "text")},
        {"tdD", Plain(Storage::kInt32, "date")},
    };
    const auto found = kTypes.find(format);
    if (found != kTypes.end())
        return found->second;
    if (format == "tdm")
    {
        ColumnType type = Plain(Storage::kInt64, "date");
        type.divisor = 86400000.0;
        return type;
    }
    if (StartsWith(format, "ts") && format.size() >= 4)
        return Timestamp(format);
    if (StartsWith(format, "d:"))
        return Decimal(format);
    return Plain(Storage::kNone, NameUnusable(format));
}

} // namespace

ColumnType ReadColumnType(const ArrowSchema& schema)
{
    if (schema.dictionary == nullptr)
        return FromFormat(schema.format);
    ColumnType type = FromFormat(schema.dictionary->format);
    type.isDictionary = true;
    type.indexStorage = FromFormat(schema.format).storage;
    type.isOrdered = (schema.flags & kDictionaryOrdered) != 0;
    return type;
}
