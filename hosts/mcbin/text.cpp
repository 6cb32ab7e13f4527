#include "text.h"

#include <algorithm>

#include <fnmatch.h>

namespace
{

bool IsFirstByte(char c)
{
    return (static_cast<unsigned char>(c) & 0xC0) != 0x80;
}

std::string MakePadding(const std::string& text, std::size_t width)
{
    return std::string(width - std::min(width, GetWidth(text)), ' ');
}

} // namespace

std::string Printable(std::string_view text)
{
    constexpr char kDigits[] = "0123456789abcdef";
    std::string printable;
    for (const char c : text)
    {
        const auto byte = static_cast<unsigned char>(c);
        if (byte >= 0x20 && byte != 0x7F)
            printable += c;
        else
            printable += {'\\', 'x', kDigits[byte / 16], kDigits[byte % 16]};
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

std::string Shorten(std::string_view text)
{
    constexpr std::size_t kLongest = 30;
    if (text.size() <= kLongest)
        return std::string(text);
    std::size_t size = kLongest;
    while (size > 0 && !IsFirstByte(text[size])) --size; // not inside a code point
    return std::string(text.substr(0, size)) + "...";
}

std::size_t GetWidth(std::string_view text)
{
    return static_cast<std::size_t>(std::count_if(text.begin(), text.end(), IsFirstByte));
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
