#include "binning/binefpreprocess.h"
#include "support/hostdata.h"

#include <gtest/gtest.h>

#include <limits>
#include <numeric>

namespace
{

struct Bins
{
    bool fIsFound = false;
    std::vector<double> fCuts;
    std::vector<double> fCounts;
};

/// Weights of 1 where none are given.
Bins Cut(const std::vector<double>& values, std::vector<double> weights, int numberOfBins, bool rightBorderClosed)
{
    weights.resize(values.size(), 1.0);
    std::vector<BINValueTuple> tuples;
    for (std::size_t i = 0; i < values.size(); ++i) tuples.push_back({values[i], weights[i]});
    const auto numTuples = static_cast<unsigned int>(tuples.size());
    tuples.push_back({-1.0, 1000.0}); // left over from another attribute: not to be read
    const double total = std::accumulate(weights.begin(), weights.end(), 0.0);
    Bins bins;
    bins.fIsFound = BINEFPreProcess(numberOfBins, rightBorderClosed)
                        .BinEqualFrequency(&tuples, numTuples, bins.fCuts, bins.fCounts, total);
    return bins;
}

std::vector<double> PreBinCuts(const std::vector<double>& values, int numberOfBins, bool rightBorderClosed)
{
    std::vector<BINSortTuple> tuples;
    for (const double value : values) tuples.push_back({value, 0, 1.0});
    std::vector<double> cuts;
    BINEFPreProcess(numberOfBins, rightBorderClosed)
        .PreBinEqualFrequency(&tuples, static_cast<unsigned int>(tuples.size()), cuts,
                              static_cast<double>(values.size()));
    return cuts;
}

} // namespace

TEST(EqualFrequency, WorkedCases)
{
    struct Case
    {
        const char* fWhat;
        std::vector<double> fValues;
        int fNumberOfBins;
        bool fRightBorderClosed;
        std::vector<double> fCuts;
        std::vector<double> fCounts;
    };
    const std::vector<Case> cases{
        {"met between two groups: midpoint", {1, 2, 3, 4}, 2, true, {2.5}, {2, 2}},
        {"met between two groups: midpoint", {1, 2, 3, 4}, 2, false, {2.5}, {2, 2}},
        {"passed inside the first group", {1, 1, 1, 2}, 2, true, {1}, {3, 1}},
        {"passed inside the first group: empty first bin goes", {1, 1, 1, 2}, 2, false, {}, {4}},
        {"passed inside the last group", {1, 2, 2, 2}, 2, true, {}, {4}},
        {"passed inside the last group", {1, 2, 2, 2}, 2, false, {2}, {1, 3}},
        {"one value", {3, 3, 3}, 4, true, {}, {3}},
        {"one value", {3, 3, 3}, 4, false, {}, {3}},
        {"thirds", {1, 2, 3}, 3, true, {1.5, 2.5}, {1, 1, 1}},
        {"more bins than values", {1, 2, 3}, 100, true, {1, 2}, {1, 1, 1}},
        {"a group passes several targets", {1, 2, 2, 2, 3}, 5, true, {1.5, 2}, {1, 3, 1}},
        {"no value between two cuts", {1, 2, 2, 2, 3}, 5, false, {1.5}, {1, 4}},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(std::string(c.fWhat) + (c.fRightBorderClosed ? ", right closed" : ", left closed"));
        const Bins bins = Cut(c.fValues, {}, c.fNumberOfBins, c.fRightBorderClosed);
        EXPECT_TRUE(bins.fIsFound);
        EXPECT_EQ(c.fCuts, bins.fCuts);
        EXPECT_EQ(c.fCounts, bins.fCounts);
    }
}

TEST(EqualFrequency, PreBinningKeepsTheCutAtTheEnd)
{
    for (const bool closed : {true, false})
    {
        EXPECT_EQ(std::vector<double>{1}, PreBinCuts({1, 1, 1, 2}, 2, closed));
        EXPECT_EQ((std::vector<double>{1.5, 2}), PreBinCuts({1, 2, 2, 2, 3}, 5, closed));
    }
}

TEST(EqualFrequency, NothingToCutIsRefused)
{
    EXPECT_FALSE(Cut({}, {}, 4, true).fIsFound);
    EXPECT_FALSE(Cut({1, 2}, {}, 0, true).fIsFound);
    EXPECT_FALSE(Cut({1, 2}, {0, 0}, 4, true).fIsFound);
    std::vector<double> cuts;
    std::vector<double> counts;
    EXPECT_FALSE(BINEFPreProcess(4, true).BinEqualFrequency(nullptr, 3, cuts, counts, 3.0));
}

TEST(EqualFrequency, CountOfBinsEndsSoonWithMoreBinsThanAnyoneWants)
{
    const Bins bins = Cut({1, 2, 3}, {}, std::numeric_limits<int>::max(), true);

    EXPECT_EQ((std::vector<double>{1, 2}), bins.fCuts);
}

TEST(EqualFrequency, WeightsLostInRoundingLeaveTheListsInStep)
{
    const double huge = 1e300;
    const double tiny = std::numeric_limits<double>::denorm_min();
    const double infinite = std::numeric_limits<double>::infinity();
    const double oneAndABit = 1.0 + std::numeric_limits<double>::epsilon();
    const double nextValue = oneAndABit + std::numeric_limits<double>::epsilon();
    struct Case
    {
        const char* fWhat;
        std::vector<double> fValues;
        std::vector<double> fWeights;
    };
    const std::vector<Case> cases{
        {"all but the first absorbed", {1, 2, 3}, {huge, 1, 1}},
        {"all but the last absorbed", {1, 2, 3}, {1, 1, huge}},
        {"targets below the smallest number", {1, 2, 3, 4}, {tiny, tiny, tiny, tiny}},
        {"infinite", {1, 2, 3}, {1, infinite, 1}},
        {"midpoint falls on the right neighbour", {1, oneAndABit, nextValue, 3}, {1, 1, 1, 1}},
    };
    for (const Case& c : cases)
    {
        for (const int numberOfBins : {2, 3, 4, 7, 10})
        {
            for (const bool closed : {true, false})
            {
                SCOPED_TRACE(std::string(c.fWhat) + ", bins " + std::to_string(numberOfBins) + ", closed " +
                             std::to_string(closed));
                const Bins bins = Cut(c.fValues, c.fWeights, numberOfBins, closed);
                EXPECT_EQ(bins.fCuts.size() + 1, bins.fCounts.size());
                EXPECT_TRUE(std::is_sorted(bins.fCuts.begin(), bins.fCuts.end()));
            }
        }
    }
}

TEST(EqualFrequency, NoWeightIsLostBetweenNeighbouringDoubles)
{
    const double step = std::numeric_limits<double>::epsilon();
    // The midpoint of the two is the even one of them: the largest value, and the smallest.
    const Bins right = Cut({1 + step, 1 + 2 * step}, {}, 2, true);
    const Bins left = Cut({1, 1 + step}, {}, 2, false);

    EXPECT_TRUE(right.fCuts.empty());
    EXPECT_EQ(std::vector<double>{2}, right.fCounts);
    EXPECT_TRUE(left.fCuts.empty());
    EXPECT_EQ(std::vector<double>{2}, left.fCounts);
}

TEST(EqualFrequency, BinsOfRandomDataHoldTheirWeight)
{
    for (unsigned int seed = 1; seed <= 2000; ++seed)
    {
        Dice dice(seed);
        const int numTuples = 1 + dice.Below(60);
        std::vector<double> values;
        std::vector<double> weights;
        for (int i = 0; i < numTuples; ++i)
        {
            values.push_back(dice.Below(seed % 3 == 0 ? 5 : 1000));
            weights.push_back(seed % 2 == 0 ? 1.0 + dice.Below(3) : 0.01 + dice.Fraction());
        }
        std::sort(values.begin(), values.end());
        const bool closed = dice.Below(2) == 0;

        const Bins bins = Cut(values, weights, 2 + dice.Below(12), closed);

        // Counted again by the borders that a user sees.
        std::vector<double> recount(bins.fCuts.size() + 1, 0.0);
        for (std::size_t i = 0; i < values.size(); ++i)
        {
            const auto bin = closed ? std::lower_bound(bins.fCuts.begin(), bins.fCuts.end(), values[i])
                                    : std::upper_bound(bins.fCuts.begin(), bins.fCuts.end(), values[i]);
            recount[static_cast<std::size_t>(bin - bins.fCuts.begin())] += weights[i];
        }
        ASSERT_EQ(recount.size(), bins.fCounts.size()) << "seed " << seed;
        for (std::size_t bin = 0; bin < recount.size(); ++bin)
            ASSERT_NEAR(recount[bin], bins.fCounts[bin], 1e-12 * numTuples) << "seed " << seed << " bin " << bin;
    }
}
