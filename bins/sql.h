#ifndef MCOBNQRT_BINS_SQL_H
#define MCOBNQRT_BINS_SQL_H

#include "bins/bins.h"

#include <string>

enum class SqlDialect
{
    kStandard, ///< what most databases take; a NaN is a value there, for want of a common way to tell it
    kDuckDb    ///< a NaN is missing
};

struct SqlOptions
{
    SqlDialect dialect = SqlDialect::kStandard;
    bool areLabels = false; ///< the labels of the bins, not their numbers from 0
};

/// A CASE expression for each result that has bins, with the name of its column, separated by commas and line ends. It
/// gives NULL for a missing value, and for a category that the bins were made without.
std::string ToSql(const Bins& bins, const SqlOptions& options);

#endif
