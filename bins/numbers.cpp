#include "bins/numbers.h"

#include <array>
#include <charconv>
#include <cmath>
#include <limits>
#include <locale>
#include <sstream>

namespace
{

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

/// The number, or a NaN if it is too large for a double. from_chars doesn't tell that from one that is too small for
/// it.
double ParseOutOfRange(std::string_view text)
{
    std::istringstream stream{std::string(text)};
    stream.imbue(std::locale::classic());
    double value = 0.0;
    stream >> value;
    return stream.fail() ? kNaN : value;
}

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
    const bool isNumber = result.ec != std::errc::invalid_argument && result.ptr == end;
    if (!isNumber)
        return kNaN;
    return result.ec == std::errc::result_out_of_range ? ParseOutOfRange(text) : value;
}

/// What to_chars writes, with further arguments for it.
template<class... Arguments>
std::string ToText(double value, Arguments... arguments)
{
    std::array<char, 400> text; // the largest double has 309 digits
    const std::to_chars_result result = std::to_chars(text.data(), text.data() + text.size(), value, arguments...);
    return std::string(text.data(), result.ptr);
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
    {
        if (kOrnaments.find(c) == std::string_view::npos)
            number += c;
        else if (found.find(c) == std::string::npos)
            found += c;
    }
    return ParseNumber(number) ? found : "";
}

std::string FormatNumber(double value)
{
    // Left to itself, to_chars writes 100000 as 1e+05, being the shorter one by a character.
    const double size = std::fabs(value);
    const bool isPlain = size == 0.0 || (size >= 1e-5 && size < 1e15);
    return isPlain ? ToText(value, std::chars_format::fixed) : ToText(value);
}

std::string FormatCategoryNumber(double value)
{
    return FormatNumber(value + 0.0);
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
    return std::fabs(value) < kSixDigits ? ToText(value, std::chars_format::general, 6)
                                         : ToText(value, std::chars_format::fixed, 0);
}
