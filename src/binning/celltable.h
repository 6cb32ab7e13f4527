#ifndef MCOBNQRT_CELLTABLE_H
#define MCOBNQRT_CELLTABLE_H

#include <cstddef>
#include <set>
#include <vector>

// The cell table of a pair: one row for each bin, which holds the bin's weight and then its weight by target code, so
// that a table of `numCategories` has numCategories + 1 columns.

/// Adds up the rows of a value table between the cut points, each of which is one of the row values `values`.
std::vector<double> FillCells(const std::vector<double>& values, const std::vector<double>& table,
                              std::size_t numCategories, bool rightBorderClosed, const std::set<double>& cutPoints);

/// Joins each small bin with the neighbour that leaves the lower partition entropy, with the left one if both leave the
/// same. A bin is small if it weighs less than `threshold` times the lighter of its neighbours; the outer bins never
/// are. All bins are judged before the first one is joined. The cut point between two joined bins is removed.
void MergeSmallBins(double threshold, std::size_t numCategories, std::vector<double>& cells,
                    std::set<double>& cutPoints);

/// The mean of the bins' entropies, each weighted by the share of the bin in `totalWeight`.
double ComputeModelEntropy(const std::vector<double>& cells, std::size_t numCategories, double totalWeight);

#endif
