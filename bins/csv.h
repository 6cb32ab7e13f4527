#ifndef MCOBNQRT_BINS_CSV_H
#define MCOBNQRT_BINS_CSV_H

#include "bins/bins.h"

#include <string>
#include <string_view>

/// The bins as CSV: a head, and a row for each bin of each result.
std::string ToCsv(const Bins& bins);

/// The field as it stands in a file: in quotes, if it has a character that would end it, or spaces at an end.
std::string QuoteField(std::string_view field, char delimiter);

#endif
