#ifndef MCOBNQRT_ARITHMETIC_H
#define MCOBNQRT_ARITHMETIC_H

#include <cfloat>

// The entropies rest on plain IEEE arithmetic in double: the order of additions, infinities, and NaNs that compare
// false. A compiler that may reorder, fuse, widen or assume these away gives other cut points, and people compare
// results between machines. Every source that decides a cut includes this header.

#if defined(__FAST_MATH__) || defined(__ASSOCIATIVE_MATH__) || defined(__RECIPROCAL_MATH__) ||                         \
    (defined(__FINITE_MATH_ONLY__) && __FINITE_MATH_ONLY__)
#error "MCOBNQRT needs IEEE arithmetic: build it without -ffast-math and the options that it stands for"
#endif

#if FLT_EVAL_METHOD != 0
#error "MCOBNQRT needs arithmetic in plain double: build it for a target without excess precision"
#endif

#endif
