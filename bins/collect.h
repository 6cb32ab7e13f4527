#ifndef MCOBNQRT_BINS_COLLECT_H
#define MCOBNQRT_BINS_COLLECT_H

#include "bins/bins.h"
#include "bins/infinitevalues.h"

#include <vector>

class BINAttributeResults;
class BINAttributeTargetResults;

/// Adds what the library has found to `bins`, whose settings are those of the run, and whose variables are those of the
/// library's list. `values` are, by variable index, the values that the library was given. A result that names no
/// variable is passed over.
void AddResult(Bins& bins, const BINAttributeTargetResults& result, const std::vector<InfiniteValues>& values);
void AddResult(Bins& bins, const BINAttributeResults& result, const std::vector<InfiniteValues>& values);

#endif
