#ifndef MCOBNQRT_BINS_JSONCURSOR_H
#define MCOBNQRT_BINS_JSONCURSOR_H

#include "bins/json.h"
#include "bins/jsonvalue.h"
#include "bins/text.h"

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

/// A value within a document, which it only points to, and its path, for messages. Every operation throws a JsonFault
/// with that path where the value is not what is asked for.
class JsonCursor
{
public:
    explicit JsonCursor(const JsonValue& document) : fValue(&document) {}

    /// The member of an object.
    JsonCursor At(const char* name) const;
    /// As At(), but nothing where there is no such member, or it is null.
    std::optional<JsonCursor> Find(const char* name) const;
    /// The elements of an array.
    std::vector<JsonCursor> GetElements() const;

    bool IsNull() const { return std::holds_alternative<std::nullptr_t>(fValue->held); }
    bool IsString() const { return std::holds_alternative<std::string>(fValue->held); }

    bool GetBoolean() const;
    const std::string& GetString() const;
    std::vector<std::string> GetStrings() const;
    /// A whole number from `least` to `most`.
    std::int64_t GetInteger(std::int64_t least = INT64_MIN, std::int64_t most = INT64_MAX) const;
    /// A number, or the text of an infinity or NaN.
    double GetNumber() const;
    std::vector<double> GetNumbers() const;
    /// Nothing where there is a null.
    std::optional<double> GetFigure() const;

    /// The value that the text names.
    template<class Value, std::size_t kSize>
    Value Choose(const std::pair<const char*, Value> (&names)[kSize]) const
    {
        for (const auto& [name, value] : names)
        {
            if (GetString() == name)
                return value;
        }
        Refuse(Quote(Shorten(GetString())) + " is not known here");
    }

    [[noreturn]] void Refuse(const std::string& why) const;

private:
    JsonCursor(const JsonValue& value, std::string path) : fValue(&value), fPath(std::move(path)) {}

    /// Refuses the value, which stands where a `wanted` should be.
    [[noreturn]] void RefuseKind(const char* wanted) const;

    const JsonValue* fValue;
    std::string fPath; ///< such as "results[0].bins"; empty of the document
};

#endif
