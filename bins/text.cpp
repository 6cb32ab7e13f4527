#include "bins/text.h"

#include "bins/utf8.h"

#include <charconv>
#include <cstdint>

namespace
{

/// Those of ASCII, and those of Latin-1, which some terminals obey as well.
bool IsControl(char32_t value)
{
    return value < 0x20 || (value >= 0x7F && value < 0xA0);
}

/// What sets the direction of writing, so that a text can be shown as another one, and the ends of lines and paragraphs
/// beyond Latin-1.
bool IsFormat(char32_t value)
{
    return value == 0x061C || value == 0x200E || value == 0x200F || (value >= 0x2028 && value <= 0x202E) ||
           (value >= 0x2066 && value <= 0x2069);
}

/// A byte that is no text, or a control character of ASCII, becomes "\x0a", any other character "\u202e".
void AppendEscaped(std::string& text, const CodePoint& point)
{
    const std::size_t numDigits = point.size > 1 ? 4 : 2;
    char digits[8];
    const char* const end =
        std::to_chars(digits, digits + sizeof digits, static_cast<std::uint32_t>(point.value), 16).ptr;
    const auto size = static_cast<std::size_t>(end - digits);
    text += point.size > 1 ? "\\u" : "\\x";
    text.append(size < numDigits ? numDigits - size : 0, '0');
    text.append(digits, size);
}

} // namespace

std::string Printable(std::string_view text)
{
    std::string printable;
    while (!text.empty())
    {
        const CodePoint point = GetFirst(text);
        const std::string_view bytes = text.substr(0, point.size);
        text.remove_prefix(point.size);
        if (point.isValid && !IsControl(point.value) && !IsFormat(point.value))
            printable += bytes;
        else
            AppendEscaped(printable, point);
    }
    return printable;
}

std::string Quote(std::string_view text)
{
    return "'" + Printable(text) + "'";
}

std::string Shorten(std::string_view text, std::size_t width)
{
    const std::string_view beginning = Clip(text, width);
    return std::string(beginning) + (beginning.size() < text.size() ? "..." : "");
}

std::string Join(const std::vector<std::string>& parts, std::string_view separator)
{
    std::string joined;
    for (const std::string& part : parts)
    {
        if (&part != &parts.front())
            joined += separator;
        joined += part;
    }
    return joined;
}

std::string Enclose(std::string_view text, char quote)
{
    std::string enclosed(1, quote);
    for (const char c : text) enclosed.append(c == quote ? 2 : 1, c);
    return enclosed + quote;
}
