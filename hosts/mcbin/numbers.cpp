#include "numbers.h"

#include <array>
#include <charconv>
#include <cmath>

std::optional<double> ParseNumber(std::string_view text)
{
    // The sign that from_chars doesn't take. Behind it must not stand another one.
    if (text.size() > 1 && text[0] == '+' && text[1] != '-')
        text.remove_prefix(1);
    double value = 0.0;
    const char* const end = text.data() + text.size();
    const std::from_chars_result result = std::from_chars(text.data(), end, value);
    if (result.ec != std::errc() || result.ptr != end || !std::isfinite(value))
        return std::nullopt;
    return value;
}

bool IsNumber(std::string_view text)
{
    // Digits and at most one point, which can be no other number than a small one; the rest is from_chars's.
    constexpr std::size_t kSmallSize = 40;
    std::size_t digits = 0;
    std::size_t points = 0;
    const std::size_t sign = !text.empty() && text.front() == '-' ? 1 : 0;
    for (const char c : text.substr(sign))
    {
        digits += static_cast<unsigned char>(c - '0') < 10;
        points += c == '.';
    }
    const bool isPlain = digits > 0 && points <= 1 && sign + digits + points == text.size();
    return (isPlain && text.size() < kSmallSize) || ParseNumber(text).has_value();
}

std::string FormatNumber(double value)
{
    // Left to itself, to_chars writes 100000 as 1e+05, being the shorter one by a character.
    const double size = std::fabs(value);
    const bool isPlain = size == 0.0 || (size >= 1e-5 && size < 1e15);
    std::array<char, 32> text;
    const std::to_chars_result result =
        isPlain ? std::to_chars(text.data(), text.data() + text.size(), value, std::chars_format::fixed)
                : std::to_chars(text.data(), text.data() + text.size(), value);
    return std::string(text.data(), result.ptr);
}
