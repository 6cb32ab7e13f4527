#ifndef MCOBNQRT_BINS_LABELS_H
#define MCOBNQRT_BINS_LABELS_H

#include "bins/bins.h"
#include "bins/encoding.h"

#include <cstddef>
#include <string>
#include <vector>

// What bins and the columns of bins are called.

/// The value as people read it: a number as FormatNumber writes it, "false" and "true", a date, or a timestamp. One
/// that is shown in a time zone is followed by "+00:00", as this knows no zones.
std::string FormatValue(double value, const Variable& variable);

/// The cut points, where one between two days or two microseconds is the nearest of these that parts the same dates or
/// timestamps.
std::vector<double> MakeBorders(const AttributeBins& bins);

/// The texts of the borders.
std::vector<std::string> FormatBorders(const AttributeBins& bins);

/// The category with this code as people read it.
std::string FormatCategory(const Variable& variable, std::size_t code);

/// By bin: the codes of the categories of a categorical attribute that it holds.
std::vector<std::vector<std::size_t>> FindCodes(const AttributeBins& bins);

/// By bin: "(1.5, 4]", with the bracket at the end that is closed; "(-inf, 1.5]" and "(4, +inf)" at the outside, which
/// hold the infinities. An infinity that is a cut point has a bin for itself: "[-inf, -inf]" with the right end closed,
/// and "[+inf, +inf]" with the left one. Of a categorical attribute the categories, as in "{a, b}".
std::vector<std::string> MakeLabels(const AttributeBins& bins);

/// A column of bins in new data.
struct BinColumn
{
    const AttributeBins* bins; ///< that of the result it was made from
    std::string name;
};

/// A column for each result that has bins. It is called "age_bin", or "age_by_bought_bin" if there are results for
/// several targets, with the suffix of the encoding. Where a column of the data, of which `taken` has the names, or an earlier column of bins has the
/// name, "_2", "_3" and so on follow it.
std::vector<BinColumn> MakeBinColumns(const Bins& bins, const std::vector<std::string>& taken,
                                      Encoding encoding = Encoding::kNumber);

/// The results without bins, which have no column, as in "'age' has no bins: error 120012: ...".
std::vector<std::string> DescribeUnbinned(const Bins& bins);

#endif
