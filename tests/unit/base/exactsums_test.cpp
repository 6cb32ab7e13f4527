#include "base/exactsums.h"

#include <gtest/gtest.h>

#include <numeric>
#include <vector>

namespace
{

bool AreExact(const std::vector<double>& weights)
{
    ExactSums sums(std::accumulate(weights.begin(), weights.end(), 0.0));
    for (const double weight : weights) sums.Add(weight);
    return sums.AreExact();
}

} // namespace

TEST(ExactSums, AreThoseOfLessThanTwoToThe53Units)
{
    struct Case
    {
        const char* fWhat;
        std::vector<double> fWeights;
        bool fIsExact;
    };
    const double largest = std::numeric_limits<double>::max();
    const std::vector<Case> cases{
        {"ones", {1, 1, 1}, true},
        {"sixteenths", {0.0625, 3.3125, 1000000}, true},
        {"just below 2^53", {0x1p53 - 2, 1}, true},
        {"2^53, in which ones are lost", {0x1p53, 1, 1, 1}, false},
        {"2^53 - 1, and then the next one is still exact, but not the one behind it", {0x1p53 - 1, 1, 1}, false},
        {"2^53 that is even", {0x1p52, 0x1p52}, true},
        {"tenths", {0.1, 0.2, 0.3}, false},
        {"multiples of 2^-40 below 2^13", {0x1p-40, 0x1p13 - 0x1p-39}, true},
        {"multiples of 2^-40 up to 2^13", {0x1p-40, 0x1p13 - 0x1p-40}, false},
        {"grid of 2^1000", {0x1p1000, 0x3p1000, 0x1p1010}, true},
        {"the smallest numbers", {0x1p-1074, 0x3p-1074, 0x1p-1022}, true},
        {"a total that no power of two is above", {largest / 2, largest / 2}, false},
        {"infinite", {1, std::numeric_limits<double>::infinity()}, false},
    };
    for (const Case& c : cases) EXPECT_EQ(c.fIsExact, AreExact(c.fWeights)) << c.fWhat;
}
