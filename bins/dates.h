#ifndef MCOBNQRT_BINS_DATES_H
#define MCOBNQRT_BINS_DATES_H

#include <optional>
#include <string>

/// The date `days` after 1970-01-01, as in "2024-01-31". Nothing outside the years 1 to 9999.
std::optional<std::string> FormatDate(double days);

/// The time `microseconds` after 1970-01-01 00:00, as in "2024-01-31 12:00:00" or "2024-01-31 12:00:00.000001". Nothing
/// outside the years 1 to 9999.
std::optional<std::string> FormatTimestamp(double microseconds);

#endif
