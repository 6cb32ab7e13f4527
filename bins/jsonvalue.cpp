#include "bins/jsonvalue.h"

#include "bins/numbers.h"
#include "bins/utf8.h"

#include <cmath>
#include <string_view>

namespace
{

void AppendEscaped(std::string& json, char c)
{
    constexpr std::string_view kEscaped = "\"\\\b\f\n\r\t";
    constexpr std::string_view kLetters = "\"\\bfnrt";
    constexpr std::string_view kDigits = "0123456789abcdef";
    const std::size_t index = kEscaped.find(c);
    const auto byte = static_cast<unsigned char>(c);
    if (index != std::string_view::npos)
        json += {'\\', kLetters[index]};
    else if (byte < 0x20)
        json += {'\\', 'u', '0', '0', kDigits[byte / 16], kDigits[byte % 16]};
    else
        json += c;
}

void AppendString(std::string& json, std::string_view text)
{
    json += '"';
    while (!text.empty())
    {
        const CodePoint point = GetFirst(text);
        if (point.size > 1)
            json += text.substr(0, point.size);
        else if (point.isValid)
            AppendEscaped(json, text.front());
        else
        {
            json += "\xEF\xBF\xBD"; // U+FFFD
        }
        text.remove_prefix(point.size);
    }
    json += '"';
}

/// Whether no object is in it.
bool IsFlat(const JsonValue& value)
{
    if (std::holds_alternative<JsonValue::Object>(value.held))
        return false;
    if (const auto* const array = std::get_if<JsonValue::Array>(&value.held))
    {
        for (const JsonValue& element : *array)
        {
            if (!IsFlat(element))
                return false;
        }
    }
    return true;
}

/// Writes a value, with `indent` in front of each further line.
class Writer
{
public:
    explicit Writer(std::string& json) : fJson(json) {}

    void Write(const JsonValue& value, const std::string& indent)
    {
        std::visit([this, &indent](const auto& held) { this->WriteHeld(held, indent); }, value.held);
    }

private:
    void WriteHeld(std::nullptr_t, const std::string&) { fJson += "null"; }
    void WriteHeld(bool value, const std::string&) { fJson += value ? "true" : "false"; }
    void WriteHeld(std::int64_t value, const std::string&) { fJson += std::to_string(value); }
    void WriteHeld(double value, const std::string&) { fJson += FormatNumber(value); }
    void WriteHeld(const std::string& value, const std::string&) { AppendString(fJson, value); }

    void WriteHeld(const JsonValue::Array& array, const std::string& indent)
    {
        bool isFlat = true;
        for (const JsonValue& element : array) isFlat = isFlat && IsFlat(element);
        WriteElements('[', ']', array, isFlat, indent,
                      [this](const JsonValue& element, const std::string& deeper) { Write(element, deeper); });
    }

    void WriteHeld(const JsonValue::Object& object, const std::string& indent)
    {
        bool isFlat = true;
        for (const JsonValue::Member& member : object) isFlat = isFlat && IsFlat(member.value);
        WriteElements('{', '}', object, isFlat, indent,
                      [this](const JsonValue::Member& member, const std::string& deeper)
                      {
                          AppendString(fJson, member.name);
                          fJson += ": ";
                          Write(member.value, deeper);
                      });
    }

    template<class Elements, class WriteElement>
    void WriteElements(char open, char close, const Elements& elements, bool isFlat, const std::string& indent,
                       WriteElement writeElement)
    {
        const std::string deeper = indent + "  ";
        fJson += open;
        for (const auto& element : elements)
        {
            if (&element != &elements.front())
                fJson += isFlat ? ", " : ",";
            if (!isFlat)
                fJson += "\n" + deeper;
            writeElement(element, deeper);
        }
        if (!isFlat)
            fJson += "\n" + indent;
        fJson += close;
    }

    std::string& fJson;
};

} // namespace

JsonValue::JsonValue(double number)
{
    if (std::isfinite(number))
        held = number;
    else
        held = std::isnan(number) ? "nan" : FormatNumber(number);
}

std::string WriteJson(const JsonValue& value)
{
    std::string json;
    Writer(json).Write(value, "");
    return json + '\n';
}
