#ifndef MCOBNQRT_BINSORTTUPLE_H
#define MCOBNQRT_BINSORTTUPLE_H

#include <cstdint>

/// One usable record of a pair of attribute and target: neither of the two is missing in it.
struct BINSortTuple
{
    double fValue;            ///< of the attribute
    std::uint8_t fTargetCode; ///< the target's code, truncated to a whole number
    double fWeight;           ///< above 0; 1.0 in a list without a weight variable
};

#endif
