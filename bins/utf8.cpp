#include "bins/utf8.h"

#include <array>

#include <wchar.h>

namespace
{

/// wcwidth goes by the locale, which main() sets. Where it doesn't know, 1 is the best guess.
std::size_t GetWidth(const CodePoint& point)
{
    const int width = point.isValid ? wcwidth(static_cast<wchar_t>(point.value)) : 1;
    return width < 0 ? 1 : static_cast<std::size_t>(width);
}

} // namespace

CodePoint GetFirst(std::string_view text)
{
    constexpr std::array<char32_t, 5> kLeast{0, 0, 0x80, 0x800, 0x10000}; // by size; below is too long a form
    const auto byte = [&](std::size_t i) { return static_cast<unsigned char>(text[i]); };
    const std::size_t size = byte(0) < 0x80 ? 1 : byte(0) < 0xE0 ? 2 : byte(0) < 0xF0 ? 3 : 4;
    bool isValid = (byte(0) < 0x80 || byte(0) >= 0xC0) && byte(0) < 0xF8 && size <= text.size();
    char32_t value = size == 1 ? byte(0) : byte(0) & (0x7FU >> size);
    for (std::size_t i = 1; isValid && i < size; ++i)
    {
        isValid = (byte(i) & 0xC0) == 0x80;
        value = value << 6 | (byte(i) & 0x3F);
    }
    const bool isHalf = value >= 0xD800 && value < 0xE000; // of a pair, as UTF-16 has them
    isValid = isValid && value >= kLeast[size] && value <= 0x10FFFF && !isHalf;
    return isValid ? CodePoint{value, size, true} : CodePoint{byte(0), 1, false};
}

bool IsText(std::string_view text)
{
    while (!text.empty())
    {
        const CodePoint point = GetFirst(text);
        if (!point.isValid || point.value == 0)
            return false;
        text.remove_prefix(point.size);
    }
    return true;
}

std::size_t GetWidth(std::string_view text)
{
    std::size_t width = 0;
    while (!text.empty())
    {
        const CodePoint point = GetFirst(text);
        width += GetWidth(point);
        text.remove_prefix(point.size);
    }
    return width;
}

std::string_view Clip(std::string_view text, std::size_t width)
{
    std::size_t size = 0;
    while (size < text.size())
    {
        const CodePoint point = GetFirst(text.substr(size));
        if (GetWidth(point) > width)
            break;
        width -= GetWidth(point);
        size += point.size;
    }
    return text.substr(0, size);
}
