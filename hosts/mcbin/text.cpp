#include "hosts/mcbin/text.h"

#include "bins/utf8.h"

#include <algorithm>

#include <fnmatch.h>

namespace
{

std::string MakePadding(const std::string& text, std::size_t width)
{
    return std::string(width - std::min(width, GetWidth(text)), ' ');
}

} // namespace

std::string EscapeHtml(std::string_view text)
{
    std::string escaped;
    for (const char c : Printable(text))
    {
        switch (c)
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
    }
    return escaped;
}

std::string PadLeft(const std::string& text, std::size_t width)
{
    return MakePadding(text, width) + text;
}

std::string PadRight(const std::string& text, std::size_t width)
{
    return text + MakePadding(text, width);
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
    {
        if (c == '\\')
            pattern += "\\\\";
        else
            pattern += IsPattern(std::string_view(&c, 1)) ? std::string{'[', c, ']'} : std::string(1, c);
    }
    return pattern;
}
