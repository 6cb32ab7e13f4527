#ifndef MCOBNQRT_TALLY_H
#define MCOBNQRT_TALLY_H

#include "data/binsorttuple.h"

#include <mcobnqrt/mcstatus.h>

#include <vector>

// A tally adds up the weights of a pair's tuples in a value table: one row of `numCategories` cells for each interval
// of values, in rising order. Of the tuples the first `numTuples` count, which are sorted by value.

/// Makes one row for each distinct value. `numDistinct` says how many there are; `values` arrives empty and gets them.
void TallyDistinct(const std::vector<BINSortTuple>& tuples, unsigned int numTuples, unsigned int numDistinct,
                   unsigned int numCategories, std::vector<double>& values, std::vector<double>& table);

/// Makes one row for each bin. `cuts` holds the borders of the bins in rising order, from an outer left one, which is
/// never compared, to the right border of the last bin.
///
/// \return OK, or the warning BINStatusBadBinTable if there are no borders, or the tuples end before the last bin or go
///         on past it; the table is worth nothing then.
MCBinning::MCStatus TallyBins(const std::vector<BINSortTuple>& tuples, unsigned int numTuples,
                              unsigned int numCategories, const std::vector<double>& cuts, bool rightBorderClosed,
                              std::vector<double>& table);

#endif
