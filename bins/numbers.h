#ifndef MCOBNQRT_BINS_NUMBERS_H
#define MCOBNQRT_BINS_NUMBERS_H

#include <optional>
#include <string>
#include <string_view>

/// The number that the whole of `text` spells with a decimal point, such as "-1", "+.5" or "2.5e-3", whatever the
/// locale. Spaces around it don't count, and what is nearer to 0 than any double is 0. "inf" and "infinity" are one, in
/// capital and small letters and with a sign. Nothing for all else: other text, even behind a number; a number that is
/// too large for a double; "nan".
std::optional<double> ParseNumber(std::string_view text);

/// As ParseNumber, but returns NaN where there is no number. It is for millions of fields: an optional is stored in two
/// parts and loaded as a whole, for which the processor waits half as long as it takes to read the number.
double ParseNumberOrNaN(std::string_view text);

/// What keeps the text from being a number: those of the comma, $ and % that it has, each once, if it is a number
/// without them, such as "$," of "$1,234.50". Otherwise empty.
std::string FindOrnaments(std::string_view text);

/// For a message about such numbers.
constexpr const char* kPlainNumbers = "numbers are written as in 1234.5, without commas, $ and %";

/// The number in as few digits as read back to the same double. Infinities are "inf" and "-inf".
std::string FormatNumber(double value);

/// As FormatNumber, but for a category, as which the negative zero is 0.
std::string FormatCategoryNumber(double value);

/// As FormatNumber, but returns "none" for a figure that was not found.
std::string FormatFigure(const std::optional<double>& figure);

/// A sum of weights, for a person: in full if it is whole, and else in 6 digits, or as many as there are before the
/// point.
std::string FormatWeight(double value);

#endif
