#ifndef MCOBNQRT_ENTROPYSPLIT_H
#define MCOBNQRT_ENTROPYSPLIT_H

#include <mcobnqrt/mcstatus.h>

#include <cstddef>
#include <set>
#include <vector>

/// Adds the cut points of the rows `first` to `last`, both inclusive, to `cutPoints`. `table` is a value table of
/// `numCategories` columns, at least one; `values` holds the border of each row that can become a cut point: the right
/// one if that is closed, else the left one.
///
/// \return OK, or the error BINStatusBadBinTable, with the set untouched, if `values` and `table` differ in their rows.
MCBinning::MCStatus FindCutPoints(const std::vector<double>& values, const std::vector<double>& table,
                                  std::size_t numCategories, bool rightBorderClosed, int first, int last,
                                  std::set<double>& cutPoints);

#endif
