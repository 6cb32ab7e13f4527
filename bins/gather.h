#ifndef MCOBNQRT_BINS_GATHER_H
#define MCOBNQRT_BINS_GATHER_H

#include "bins/bins.h"

#include <cstdint>
#include <optional>

/// Adds what a run of a single attribute, the first of its variables, or of a pair with its second one as the target,
/// has found to the bins of all variables, as one run of all attributes would have found it.
///
/// \param attribute,target indices of variables of `whole`; `target` is -1 without one.
/// \param numDistinct how many different values the attribute has, where the run was given fewer.
void AddPart(Bins& whole, const Bins& part, int attribute, int target, std::optional<std::int64_t> numDistinct);

#endif
