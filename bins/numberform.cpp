#include "bins/numberform.h"

#include <limits>
#include <stdexcept>
#include <string>

namespace
{

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

bool IsDigit(char c)
{
    return c >= '0' && c <= '9';
}

/// With blanks for no-break spaces, of which one is narrow, and without those at the ends.
std::string ReplaceNoBreakSpaces(std::string_view text)
{
    std::string replaced(text);
    for (const std::string_view space : {"\xc2\xa0", "\xe2\x80\xaf"})
    {
        for (std::size_t at = 0; (at = replaced.find(space, at)) != std::string::npos;)
            replaced.replace(at, space.size(), " ");
    }
    while (!replaced.empty() && replaced.back() == ' ') replaced.pop_back();
    const std::size_t first = replaced.find_first_not_of(' ');
    return first == std::string::npos ? "" : replaced.substr(first);
}

/// The text without what separates its groups of digits; empty if they are not one of up to three digits and further
/// ones of three.
std::string JoinGroups(std::string_view text, char separator)
{
    std::string joined;
    std::size_t numDigits = 0; // of the group
    bool isFirst = true;
    const auto isComplete = [&] { return isFirst ? numDigits >= 1 && numDigits <= 3 : numDigits == 3; };
    for (const char c : text)
    {
        if (c != separator)
        {
            numDigits += IsDigit(c) ? 1 : 0;
            joined += c;
            continue;
        }
        if (!isComplete())
            return "";
        isFirst = false;
        numDigits = 0;
    }
    return isComplete() ? joined : "";
}

} // namespace

NumberForm::NumberForm(char decimal, char thousands)
    : fDecimal(decimal), fThousands(thousands), fIsPlain(decimal == '.' && thousands == '\0')
{
    constexpr std::string_view kDecimals = ".,";
    constexpr std::string_view kThousands = ".,' _";
    if (kDecimals.find(decimal) == std::string_view::npos)
        throw std::invalid_argument("the decimal sign is a point or a comma");
    if (thousands != '\0' && kThousands.find(thousands) == std::string_view::npos)
        throw std::invalid_argument("between thousands stands a point, a comma, an apostrophe, a blank or _");
    if (decimal == thousands)
        throw std::invalid_argument("the decimal sign can't stand between thousands, too");
}

double NumberForm::ParseForeign(std::string_view text) const
{
    const std::string trimmed = ReplaceNoBreakSpaces(text);
    const std::size_t point = trimmed.find(fDecimal);
    std::string plain = trimmed.substr(0, point);
    if (fThousands != '\0' && plain.find(fThousands) != std::string::npos)
        plain = JoinGroups(plain, fThousands);
    const bool hasNoDigits = plain.empty() && !trimmed.empty() && trimmed[0] != fDecimal;
    if (hasNoDigits || plain.find('.') != std::string::npos)
        return kNaN;
    if (point == std::string::npos)
        return ParseNumberOrNaN(plain);
    const std::string fraction = trimmed.substr(point + 1);
    return fraction.find('.') == std::string::npos ? ParseNumberOrNaN(plain + "." + fraction) : kNaN;
}
