#ifndef MCOBNQRT_BINS_LOOKUP_H
#define MCOBNQRT_BINS_LOOKUP_H

#include <algorithm>
#include <cstddef>
#include <vector>

/// The bin of a value, which is not NaN, from 0. A value outside the range seen belongs to an outer bin.
inline std::size_t FindBin(const std::vector<double>& cutPoints, bool isRightClosed, double value)
{
    const auto cut = isRightClosed ? std::lower_bound(cutPoints.begin(), cutPoints.end(), value)
                                   : std::upper_bound(cutPoints.begin(), cutPoints.end(), value);
    return static_cast<std::size_t>(cut - cutPoints.begin());
}

#endif
