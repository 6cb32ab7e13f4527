#include "hosts/mcbin/numbers.h"

#include <fmt/format.h>

#include <array>
#include <charconv>
#include <cmath>
#include <cstdlib>
#include <limits>

namespace
{

/// The number, or a NaN, of what from_chars doesn't take as it is.
double ParseUnusualNumber(std::string_view text)
{
    // Within quotes the reader leaves them.
    while (!text.empty() && text.front() == ' ') text.remove_prefix(1);
    while (!text.empty() && text.back() == ' ') text.remove_suffix(1);
    // The sign that from_chars doesn't take. Behind it must not stand another one.
    if (text.size() > 1 && text[0] == '+' && text[1] != '-')
        text.remove_prefix(1);
    double value = 0.0;
    const char* const end = text.data() + text.size();
    const std::from_chars_result result = std::from_chars(text.data(), end, value);
    // Too large a number and too small a one are the same to from_chars.
    if (result.ec == std::errc::result_out_of_range)
        value = std::strtod(std::string(text).c_str(), nullptr);
    const bool isTooLarge = result.ec == std::errc::result_out_of_range && std::isinf(value);
    const bool isNumber = result.ec != std::errc::invalid_argument && result.ptr == end && !isTooLarge;
    return isNumber ? value : std::numeric_limits<double>::quiet_NaN();
}

} // namespace

std::optional<double> ParseNumber(std::string_view text)
{
    const double value = ParseNumberOrNaN(text);
    return std::isnan(value) ? std::nullopt : std::optional(value);
}

double ParseNumberOrNaN(std::string_view text)
{
    double value = 0.0;
    const char* const end = text.data() + text.size();
    const std::from_chars_result result = std::from_chars(text.data(), end, value);
    const bool isNumber = result.ec == std::errc() && result.ptr == end; // or a NaN, from "nan"
    return isNumber ? value : ParseUnusualNumber(text);
}

std::string FindOrnaments(std::string_view text)
{
    constexpr std::string_view kOrnaments = ",$%";
    if (text.find_first_of(kOrnaments) == std::string_view::npos)
        return "";
    std::string number;
    std::string found;
    for (const char c : text)
        if (kOrnaments.find(c) == std::string_view::npos)
            number += c;
        else if (found.find(c) == std::string::npos)
            found += c;
    return ParseNumber(number) ? found : "";
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

std::string FormatFigure(const std::optional<double>& figure)
{
    return figure ? FormatNumber(*figure) : "none";
}

std::string FormatWeight(double value)
{
    constexpr double kSixDigits = 1e6;
    if (value == std::floor(value))
        return FormatNumber(value);
    return std::fabs(value) < kSixDigits ? fmt::format("{:.6g}", value) : fmt::format("{:.0f}", value);
}
