#ifndef MCOBNQRT_BINS_JSONVALUE_H
#define MCOBNQRT_BINS_JSONVALUE_H

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <variant>
#include <vector>

/// A value of JSON. To read a text, a host parses it with the parser that it has, and makes these of what that gives.
struct JsonValue
{
    struct Member;
    using Array = std::vector<JsonValue>;
    using Object = std::vector<Member>; ///< in the order of the text

    JsonValue() = default; ///< null
    JsonValue(bool truth) : held(truth) {}
    JsonValue(int number) : held(std::int64_t{number}) {}
    JsonValue(std::int64_t number) : held(number) {}
    /// Infinities and NaN, which JSON doesn't have, become the texts "inf", "-inf" and "nan".
    JsonValue(double number);
    JsonValue(const char* text) : held(std::string(text)) {}
    JsonValue(std::string text) : held(std::move(text)) {}
    JsonValue(Array array) : held(std::move(array)) {}
    JsonValue(Object object) : held(std::move(object)) {}
    template<class Value>
    JsonValue(const std::optional<Value>& optional)
    {
        if (optional)
            *this = JsonValue(*optional);
    }
    template<class Value>
    JsonValue(const std::vector<Value>& values) : held(Array(values.begin(), values.end()))
    {
    }

    std::variant<std::nullptr_t, bool, std::int64_t, double, std::string, Array, Object> held;
};

struct JsonValue::Member
{
    std::string name;
    JsonValue value;
};

/// The text of the value, with a line end behind it. An object or array that holds no object stands on one line.
/// Numbers are as FormatNumber writes them, and bytes that are not UTF-8 become U+FFFD.
std::string WriteJson(const JsonValue& value);

#endif
