#include "hosts/mcbin/text.h"

#include "hosts/mcbin/utf8.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstdint>

#include <fnmatch.h>

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

/// A byte that is no text, or a control character of ASCII, is "\x0a", any other character "\u202e".
void AppendEscaped(std::string& text, const CodePoint& point)
{
    text += fmt::format(point.size > 1 ? "\\u{:04x}" : "\\x{:02x}", static_cast<std::uint32_t>(point.value));
}

std::string MakePadding(const std::string& text, std::size_t width)
{
    return std::string(width - std::min(width, GetWidth(text)), ' ');
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

std::string EscapeHtml(std::string_view text)
{
    std::string escaped;
    for (const char c : Printable(text)) switch (c)
        {
        case '&':
            escaped += "&amp;";
            break;
        case '<':
            escaped += "&lt;";
            break;
        case '>':
            escaped += "&gt;";
            break;
        case '"':
            escaped += "&quot;";
            break;
        default:
            escaped += c;
        }
    return escaped;
}

std::string Shorten(std::string_view text, std::size_t width)
{
    const std::string_view beginning = Clip(text, width);
    return std::string(beginning) + (beginning.size() < text.size() ? "..." : "");
}

std::string PadLeft(const std::string& text, std::size_t width)
{
    return MakePadding(text, width) + text;
}

std::string PadRight(const std::string& text, std::size_t width)
{
    return text + MakePadding(text, width);
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

std::vector<std::string> Split(std::string_view text, char separator)
{
    std::vector<std::string> parts;
    for (;;)
    {
        const std::size_t end = text.find(separator);
        parts.emplace_back(text.substr(0, end));
        if (end == std::string_view::npos)
            return parts;
        text.remove_prefix(end + 1);
    }
}

bool Matches(const std::string& pattern, const std::string& name)
{
    return pattern == name || fnmatch(pattern.c_str(), name.c_str(), 0) == 0;
}

bool IsPattern(std::string_view text)
{
    return text.find_first_of("*?[") != std::string_view::npos;
}

std::string EscapePattern(std::string_view name)
{
    std::string pattern;
    for (const char c : name)
        if (c == '\\')
            pattern += "\\\\";
        else
            pattern += IsPattern(std::string_view(&c, 1)) ? std::string{'[', c, ']'} : std::string(1, c);
    return pattern;
}
