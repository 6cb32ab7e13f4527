#include "bins/jsoncursor.h"

#include <limits>

JsonCursor JsonCursor::At(const char* name) const
{
    const auto* const object = std::get_if<JsonValue::Object>(&fValue->held);
    if (!object)
        RefuseKind("an object");
    for (const JsonValue::Member& member : *object)
    {
        if (member.name == name)
            return JsonCursor(member.value, fPath.empty() ? name : fPath + "." + name);
    }
    Refuse(std::string("the member '") + name + "' is missing");
}

std::optional<JsonCursor> JsonCursor::Find(const char* name) const
{
    const auto* const object = std::get_if<JsonValue::Object>(&fValue->held);
    if (!object)
        RefuseKind("an object");
    for (const JsonValue::Member& member : *object)
    {
        if (member.name == name && !std::holds_alternative<std::nullptr_t>(member.value.held))
            return At(name);
    }
    return std::nullopt;
}

std::vector<JsonCursor> JsonCursor::GetElements() const
{
    const auto* const array = std::get_if<JsonValue::Array>(&fValue->held);
    if (!array)
        RefuseKind("a list");
    std::vector<JsonCursor> elements;
    for (std::size_t i = 0; i < array->size(); ++i)
        elements.push_back(JsonCursor((*array)[i], fPath + "[" + std::to_string(i) + "]"));
    return elements;
}

bool JsonCursor::GetBoolean() const
{
    if (!std::holds_alternative<bool>(fValue->held))
        RefuseKind("true or false");
    return std::get<bool>(fValue->held);
}

const std::string& JsonCursor::GetString() const
{
    const auto* const text = std::get_if<std::string>(&fValue->held);
    if (!text)
        RefuseKind("a text");
    return *text;
}

std::vector<std::string> JsonCursor::GetStrings() const
{
    std::vector<std::string> texts;
    for (const JsonCursor& element : GetElements()) texts.push_back(element.GetString());
    return texts;
}

std::int64_t JsonCursor::GetInteger(std::int64_t least, std::int64_t most) const
{
    const auto* const integer = std::get_if<std::int64_t>(&fValue->held);
    if (!integer)
        RefuseKind("a whole number");
    if (*integer < least || *integer > most)
        Refuse(std::to_string(*integer) + " is not from " + std::to_string(least) + " to " + std::to_string(most));
    return *integer;
}

double JsonCursor::GetNumber() const
{
    if (const auto* const integer = std::get_if<std::int64_t>(&fValue->held))
        return static_cast<double>(*integer);
    if (const auto* const number = std::get_if<double>(&fValue->held))
        return *number;
    if (const auto* const text = std::get_if<std::string>(&fValue->held))
    {
        if (*text == "inf" || *text == "-inf")
            return (*text == "inf" ? 1 : -1) * std::numeric_limits<double>::infinity();
        if (*text == "nan")
            return std::numeric_limits<double>::quiet_NaN();
    }
    RefuseKind("a number");
}

std::vector<double> JsonCursor::GetNumbers() const
{
    std::vector<double> numbers;
    for (const JsonCursor& element : GetElements()) numbers.push_back(element.GetNumber());
    return numbers;
}

std::optional<double> JsonCursor::GetFigure() const
{
    return IsNull() ? std::nullopt : std::optional(GetNumber());
}

void JsonCursor::Refuse(const std::string& why) const
{
    throw JsonFault(fPath.empty() ? why : fPath + ": " + why);
}

void JsonCursor::RefuseKind(const char* wanted) const
{
    std::string json = WriteJson(*fValue);
    json.pop_back(); // the line end
    Refuse(Quote(Shorten(json)) + " stands where " + wanted + " should be");
}
