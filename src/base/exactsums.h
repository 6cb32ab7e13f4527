#ifndef MCOBNQRT_EXACTSUMS_H
#define MCOBNQRT_EXACTSUMS_H

#include "platform/arithmetic.h"

#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>

/// Finds out whether sums of weights are exact, so that any order of additions and subtractions gives the same bits:
///
///     ExactSums sums(total);
///     for (const double weight : weights) sums.Add(weight);
///     if (sums.AreExact()) ...
///
/// `total` is the sum of all weights as it was worked out, in whatever order. Let 2^e be the lowest power of two above
/// it. Doubles below 2^e hold all multiples of the unit 2^(e - 53), so if every weight is one, every sum of some of
/// them is exact, and so is every difference of such sums. That is so for whole numbers with a total below 2^53, and
/// for all other weights that are multiples of one power of two with a total below 2^53 of them.
///
/// A total of exactly 2^53 units doesn't count, since it may be a larger one that has lost what was added to it. As
/// rounding keeps order, a total that comes out below 2^53 units has lost nothing.
class ExactSums
{
public:
    explicit ExactSums(double total) : fLimit(LimitOf(total)) {}

    /// `weight` is in [0, total].
    void Add(double weight)
    {
        // What `weight` has below the unit is lost here: the difference is at least 2^(e - 1) in size, or `weight` is.
        const double rounded = (weight - fLimit) + fLimit;
        std::uint64_t bits = 0;
        std::uint64_t roundedBits = 0;
        std::memcpy(&bits, &weight, sizeof(bits));
        std::memcpy(&roundedBits, &rounded, sizeof(roundedBits));
        fLostBits |= bits ^ roundedBits; // collected, not compared: a loop without a branch is vectorised
    }

    bool AreExact() const { return fLostBits == 0; }

private:
    /// 2^e. Infinite where a double can't hold that, and then every weight is lost.
    static double LimitOf(double total)
    {
        if (!(total <= std::numeric_limits<double>::max()))
            return std::numeric_limits<double>::infinity();
        int exponent = 0;
        std::frexp(total, &exponent);
        return std::ldexp(1.0, exponent);
    }

    double fLimit;
    std::uint64_t fLostBits = 0;
};

#endif
