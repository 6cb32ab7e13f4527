#ifndef MCOBNQRT_BINS_SQL_H
#define MCOBNQRT_BINS_SQL_H

#include "bins/bins.h"
#include "bins/encoding.h"

#include <string>

enum class SqlDialect
{
    kStandard, ///< what most databases take; a NaN is a value there, for want of a common way to tell it
    kDuckDb    ///< a NaN is missing
};

struct SqlOptions
{
    SqlDialect dialect = SqlDialect::kStandard;
    Encoding encoding = Encoding::kNumber;
    bool isCast = false; ///< columns of numbers hold texts, as they do in a file, and are cast
    std::string table;   ///< of the SELECT around the expressions, as it stands in SQL; empty for the expressions alone
};

/// A CASE expression for each result that has bins, with the name of its column, separated by commas and line ends. A
/// missing value, and a category that the bins were made without, get what MakeCodes() has for them, which of numbers
/// and labels is NULL.
/// \throw std::invalid_argument if a result has not the encoding, or a weight of evidence is infinite.
std::string ToSql(const Bins& bins, const SqlOptions& options);

/// The CASE expression of one attribute, which gives these codes, as doubles, whatever the encoding of the options.
/// \param missingTexts of all columns of a text file.
std::string ToSql(const AttributeBins& bins, const Codes& codes, const SqlOptions& options,
                  const std::vector<std::string>& missingTexts);

#endif
