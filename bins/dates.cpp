#include "bins/dates.h"

#include <cmath>
#include <cstdint>

namespace
{

constexpr double kFirstDay = -719162.0; // 0001-01-01
constexpr double kLastDay = 2932896.0;  // 9999-12-31

std::string PadZeros(std::int64_t number, std::size_t numDigits)
{
    const std::string digits = std::to_string(number);
    return std::string(numDigits - digits.size(), '0') + digits;
}

} // namespace

std::optional<std::string> FormatDate(double days)
{
    if (!(days >= kFirstDay && days < kLastDay + 1.0))
        return std::nullopt;
    // Years are counted from March on, so that a leap day ends one, and in eras of 400 years, which are all of one
    // length. 719468 days lie between 0000-03-01 and 1970-01-01.
    const std::int64_t day = static_cast<std::int64_t>(std::floor(days)) + 719468;
    const std::int64_t era = day / 146097;
    const std::int64_t dayOfEra = day % 146097;
    const std::int64_t yearOfEra = (dayOfEra - dayOfEra / 1460 + dayOfEra / 36524 - dayOfEra / 146096) / 365;
    const std::int64_t dayOfYear = dayOfEra - (365 * yearOfEra + yearOfEra / 4 - yearOfEra / 100);
    const std::int64_t month = (5 * dayOfYear + 2) / 153; // from March, which is 0
    const std::int64_t dayOfMonth = dayOfYear - (153 * month + 2) / 5 + 1;
    const std::int64_t year = era * 400 + yearOfEra + (month >= 10 ? 1 : 0);
    return PadZeros(year, 4) + "-" + PadZeros(month >= 10 ? month - 9 : month + 3, 2) + "-" + PadZeros(dayOfMonth, 2);
}

std::optional<std::string> FormatTimestamp(double microseconds)
{
    constexpr double kDay = 86400e6;
    const double days = std::floor(microseconds / kDay);
    const std::optional<std::string> date = FormatDate(days);
    if (!date)
        return std::nullopt;
    const auto rest = static_cast<std::int64_t>(std::floor(microseconds - days * kDay));
    const std::int64_t seconds = rest / 1000000;
    const std::int64_t fraction = rest % 1000000;
    return *date + " " + PadZeros(seconds / 3600, 2) + ":" + PadZeros(seconds / 60 % 60, 2) + ":" +
           PadZeros(seconds % 60, 2) + (fraction == 0 ? "" : "." + PadZeros(fraction, 6));
}
