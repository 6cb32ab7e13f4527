#include "bins/weightgrid.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <vector>

namespace
{

constexpr double kMax = std::numeric_limits<double>::max();
constexpr double kLeast = std::numeric_limits<double>::denorm_min();

WeightTally Tally(const std::vector<double>& weights, WeightRounding rounding = WeightRounding::kNone)
{
    WeightTally tally;
    tally.rounding = rounding;
    for (const double weight : weights) tally.Add(weight);
    return tally;
}

/// A tally of so many records, without going through them.
WeightGrid MakeGrid(std::int64_t n, double largest)
{
    WeightTally tally;
    tally.numPositive = n;
    tally.largest = largest;
    return WeightGrid(tally);
}

double Sum(const std::vector<double>& weights)
{
    double sum = 0.0;
    for (const double weight : weights) sum += weight;
    return sum;
}

} // namespace

TEST(WeightGrid, StepIsThePowerOfTwoThatMakesTheTotalAtMost52Bits)
{
    struct Case
    {
        std::int64_t n;
        double largest;
        int exponent; ///< of the step, by hand
    };
    const double justBelow2 = std::nextafter(2.0, 0.0);
    const double justAbove1 = std::nextafter(1.0, 2.0);
    const Case cases[] = {
        {150, 0.7, 7 - 52},                      // 105 <= 2^7
        {128, 1.0, 7 - 52},                      // exactly 2^7
        {129, 1.0, 8 - 52},                      // just above
        {128, justBelow2, 8 - 52},               // just below 2^8
        {128, justAbove1, 8 - 52},               // just above 2^7
        {3, 0.75, 2 - 52},                       // 2.25
        {3, 1.0 / 3.0, 0 - 52},                  // just below 1, as the double 1/3 is too small; rounds to 1
        {9007199254740991, justAbove1, 54 - 52}, // 2^53 + 1 - 2^-52, which a product of doubles rounds to 2^53
        {1, 5e-324, -1074},                      // no finer than all doubles are
        {1000, kMax, 1034 - 52},                 // 2^1024 x 1000 overflows
        {4294967295, kMax, 1056 - 52},
    };
    for (const Case& c : cases)
    {
        WeightGrid grid = MakeGrid(c.n, c.largest);
        const double step = std::ldexp(1.0, c.exponent);

        // The step itself stays, and 1.5 steps become 2, being nearer to no other even multiple.
        EXPECT_EQ(step, grid.Round(step)) << c.n << " x " << c.largest;
        if (c.exponent > -1074)
        {
            EXPECT_EQ(2 * step, grid.Round(1.5 * step)) << c.n << " x " << c.largest;
            EXPECT_EQ(step, grid.GetStep()) << c.n << " x " << c.largest;
        }
    }
}

TEST(WeightGrid, TakesTheNearestMultipleOfTiesTheEvenOneAndNever0)
{
    WeightGrid grid = MakeGrid(std::int64_t(1) << 50, 1024.0); // a step of 2^(60 - 52) = 256

    EXPECT_EQ(std::nullopt, grid.GetStep());
    EXPECT_EQ(0.0, grid.Round(0.0));
    EXPECT_EQ(1024.0, grid.Round(1024.0));
    EXPECT_EQ(std::nullopt, grid.GetStep()) << "both lie on the grid";
    EXPECT_EQ(256.0, grid.Round(1e-300));
    EXPECT_EQ(256.0, grid.GetStep());
    EXPECT_EQ(256.0, grid.Round(383.9));
    EXPECT_EQ(512.0, grid.Round(384.0));
    EXPECT_EQ(512.0, grid.Round(640.0));
    EXPECT_EQ(1024.0, grid.Round(897.0));
}

TEST(WeightGrid, LargestDoublesStayFinite)
{
    WeightGrid grid = MakeGrid(1000, kMax);

    EXPECT_EQ(kMax - std::fmod(kMax, std::ldexp(1.0, 982)), grid.Round(kMax));
    EXPECT_EQ(std::ldexp(1.0, 982), grid.Round(kLeast));
}

TEST(WeightGrid, WholeNumbersAndSixteenthsStayAsTheyAre)
{
    std::mt19937 random(1);
    for (const double unit : {1.0, 1.0 / 16.0})
    {
        std::vector<double> weights;
        for (int i = 0; i < 1000; ++i) weights.push_back(unit * static_cast<double>(random()));
        WeightGrid grid(Tally(weights));
        for (const double weight : weights) ASSERT_EQ(weight, grid.Round(weight));
        EXPECT_EQ(std::nullopt, grid.GetStep());
    }
}

TEST(WeightGrid, EverySumIsExactInEveryOrder)
{
    const unsigned int seed = std::random_device()();
    SCOPED_TRACE(seed);
    std::mt19937 random(seed);
    for (const double scale : {1.0, 1e-303, 1e300, 0.7})
    {
        std::vector<double> weights;
        for (int i = 0; i < 20000; ++i)
        {
            weights.push_back(scale == 0.7 ? scale
                                           : scale * std::exp(std::uniform_real_distribution(-40.0, 0.0)(random)));
        }
        WeightGrid grid(Tally(weights));
        std::vector<double> onGrid;
        for (const double weight : weights) onGrid.push_back(grid.Round(weight));

        const double step = grid.GetStep().value_or(kLeast);
        const double largest = *std::max_element(weights.begin(), weights.end());
        EXPECT_LE(step, std::max(kLeast, 1e-10 * largest));
        for (std::size_t i = 0; i < weights.size(); ++i)
        {
            ASSERT_EQ(0.0, std::fmod(onGrid[i], step));
            ASSERT_LE(std::fabs(onGrid[i] - weights[i]), weights[i] < step / 2 ? step : step / 2);
            ASSERT_GT(onGrid[i], 0.0);
        }
        const double sum = Sum(onGrid);
        std::shuffle(onGrid.begin(), onGrid.end(), random);
        EXPECT_EQ(sum, Sum(onGrid)) << scale;
        EXPECT_EQ(0.0, sum - Sum(onGrid));
    }
}

TEST(WeightGrid, WholeNumbersAreMadeAheadOfTheGrid)
{
    const std::vector<double> weights{0.0, 0.4, 0.5, 2.5, 3.7};
    WeightGrid truncated(Tally(weights, WeightRounding::kTruncate));
    WeightGrid closest(Tally(weights, WeightRounding::kClosest));
    const std::vector<double> down{0.0, 0.0, 0.0, 2.0, 3.0};
    const std::vector<double> near{0.0, 0.0, 1.0, 3.0, 4.0};
    for (std::size_t i = 0; i < weights.size(); ++i)
    {
        EXPECT_EQ(down[i], truncated.Round(weights[i])) << weights[i];
        EXPECT_EQ(near[i], closest.Round(weights[i])) << weights[i];
    }
    EXPECT_EQ(std::nullopt, closest.GetStep());
    EXPECT_EQ(2, Tally(weights, WeightRounding::kTruncate).numPositive);
    EXPECT_EQ(4.0, Tally(weights, WeightRounding::kClosest).largest);
    for (const WeightRounding rounding : {WeightRounding::kNone, WeightRounding::kTruncate, WeightRounding::kClosest})
        EXPECT_EQ(rounding, FindWeightRounding(GetName(rounding)));
    EXPECT_EQ(std::nullopt, FindWeightRounding("nearest"));
}
