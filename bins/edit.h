#ifndef MCOBNQRT_BINS_EDIT_H
#define MCOBNQRT_BINS_EDIT_H

#include "bins/bins.h"

#include <cstddef>
#include <string>
#include <vector>

// Bins that a person has changed. They are marked as edited, and their status is OK, since they are as they were wanted.

/// The bins with only some of their cut points left: those with the indices `kept`, which rise. The weights of what is
/// joined are added, so that no data are needed.
/// \throw std::invalid_argument if there is no such cut point.
AttributeBins JoinBins(const AttributeBins& bins, const std::vector<std::size_t>& kept);

/// The bins from `first` to `last` joined into one.
/// \throw std::invalid_argument if there are no such bins, or it is only one.
AttributeBins MergeBins(const AttributeBins& bins, std::size_t first, std::size_t last);

/// Bins between other cut points. They are without weight until records are counted in them.
/// \throw std::invalid_argument if the cut points do not rise, or one is NaN.
AttributeBins Recut(const AttributeBins& bins, const std::vector<double>& cutPoints);

/// The result with this index in place of the one that stands there.
Bins ReplaceResult(const Bins& bins, std::size_t index, AttributeBins result);

#endif
