#include "binning/binefpreprocess.h"
#include "tests/support/hostdata.h"

#include <gtest/gtest.h>

#include <cmath>
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

std::vector<double> PreBinCuts(const std::vector<double>& values, std::vector<double> weights, int numberOfBins,
                               bool rightBorderClosed)
{
    weights.resize(values.size(), 1.0);
    std::vector<BINSortTuple> tuples;
    for (std::size_t i = 0; i < values.size(); ++i) tuples.push_back({values[i], 0, weights[i]});
    std::vector<double> cuts;
    BINEFPreProcess(numberOfBins, rightBorderClosed)
        .PreBinEqualFrequency(&tuples, static_cast<unsigned int>(tuples.size()), cuts,
                              std::accumulate(weights.begin(), weights.end(), 0.0));
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
        EXPECT_EQ(std::vector<double>{1}, PreBinCuts({1, 1, 1, 2}, {}, 2, closed));
        EXPECT_EQ((std::vector<double>{1.5, 2}), PreBinCuts({1, 2, 2, 2, 3}, {}, 5, closed));
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

namespace
{

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kLargest = std::numeric_limits<double>::max();
constexpr double kSmallest = std::numeric_limits<double>::denorm_min();

double Next(double value)
{
    return std::nextafter(value, kInfinity);
}

/// Doubles in rising order from `first` on, each the neighbour of the one before or some of its neighbours away, and
/// now and then equal to it. Zeros come with both signs.
std::vector<double> Chain(Dice& dice, double first, int length)
{
    std::vector<double> values{first};
    while (static_cast<int>(values.size()) < length)
    {
        double value = values.back();
        for (int steps = dice.Below(3); steps > 0; --steps) value = Next(value);
        values.push_back(value == 0.0 && dice.Below(2) == 0 ? -0.0 : value);
    }
    std::sort(values.begin(), values.end(),
              [](double left, double right)
              { return left != right ? left < right : std::signbit(left) && !std::signbit(right); });
    return values;
}

/// The weights of the bins as a user counts them, by the cuts.
std::vector<double> Recount(const std::vector<double>& values, const std::vector<double>& weights,
                            const std::vector<double>& cuts, bool rightBorderClosed)
{
    std::vector<double> counts(cuts.size() + 1, 0.0);
    for (std::size_t i = 0; i < values.size(); ++i)
    {
        const auto bin = rightBorderClosed ? std::lower_bound(cuts.begin(), cuts.end(), values[i])
                                           : std::upper_bound(cuts.begin(), cuts.end(), values[i]);
        counts[static_cast<std::size_t>(bin - cuts.begin())] += weights[i];
    }
    return counts;
}

bool Rises(const std::vector<double>& cuts)
{
    return std::is_sorted(cuts.begin(), cuts.end(), std::less_equal<>());
}

void ExpectNear(const std::vector<double>& expected, const std::vector<double>& actual, double margin)
{
    ASSERT_EQ(expected.size(), actual.size());
    for (std::size_t bin = 0; bin < expected.size(); ++bin) EXPECT_NEAR(expected[bin], actual[bin], margin) << bin;
}

/// Cuts must rise and part the values into just the bins that the counts tell of, none of them empty; the pre-binning
/// has to find the same bins, and may have empty ones beside them.
void ExpectCountsAreWhatTheCutsGive(const std::vector<double>& values, const std::vector<double>& weights,
                                    int numberOfBins, bool rightBorderClosed, double margin)
{
    const Bins bins = Cut(values, weights, numberOfBins, rightBorderClosed);
    EXPECT_TRUE(Rises(bins.fCuts));
    EXPECT_EQ(0, std::count(bins.fCounts.begin(), bins.fCounts.end(), 0.0));
    ExpectNear(Recount(values, weights, bins.fCuts, rightBorderClosed), bins.fCounts, margin);

    const std::vector<double> rowCuts = PreBinCuts(values, weights, numberOfBins, rightBorderClosed);
    EXPECT_TRUE(Rises(rowCuts));
    std::vector<double> rows = Recount(values, weights, rowCuts, rightBorderClosed);
    rows.erase(std::remove(rows.begin(), rows.end(), 0.0), rows.end());
    ExpectNear(rows, bins.fCounts, margin);
}

/// Values in rising order: neighbouring doubles, some far apart, and some with the outermost numbers among them.
std::vector<double> RandomValues(Dice& dice, unsigned int seed, int numTuples)
{
    const std::vector<double> starts{-kInfinity,
                                     -kLargest,
                                     -1e308,
                                     -1.0,
                                     -10 * kSmallest,
                                     0.0,
                                     1.0 - 1e-15,
                                     1e300,
                                     9e307,
                                     1e308,
                                     std::nextafter(kLargest, 0.0)};
    std::vector<double> values = Chain(dice, starts[seed % starts.size()], numTuples);
    if (seed % 4 == 0) // far apart
        std::generate(values.begin(), values.end(), [&] { return dice.Below(seed % 3 == 0 ? 5 : 1000); });
    if (seed % 5 == 0)
        values.insert(values.end(), {-kInfinity, -1e308, -0.0, 0.0, 1e308, 1.7e308, kInfinity});
    std::sort(values.begin(), values.end());
    return values;
}

} // namespace

TEST(EqualFrequency, CutMetBetweenTwoValuesPartsThem)
{
    struct Case
    {
        double fLower, fUpper, fRightClosed, fLeftClosed;
    };
    const double one = Next(1.0);
    const std::vector<Case> cases{
        {1, one, 1, one},                 // the midpoint is the even one of the two: 1
        {one, Next(one), one, Next(one)}, // and here the upper one
        {-kSmallest, 0, -kSmallest, 0},
        {0, kSmallest, 0, kSmallest},
        {-kSmallest, kSmallest, 0, 0},
        {1e308, 1.5e308, 1.25e308, 1.25e308}, // the sum overflows
        {-kLargest, kLargest, 0, 0},
        {-kInfinity, 5, -kInfinity, 5},
        {5, kInfinity, 5, kInfinity},
        {kLargest, kInfinity, kLargest, kInfinity},
        {-kInfinity, kInfinity, -kInfinity, kInfinity},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(testing::PrintToString(std::pair(c.fLower, c.fUpper)));
        EXPECT_EQ(std::vector<double>{c.fRightClosed}, Cut({c.fLower, c.fUpper}, {}, 2, true).fCuts);
        EXPECT_EQ(std::vector<double>{c.fLeftClosed}, Cut({c.fLower, c.fUpper}, {}, 2, false).fCuts);
    }
}

TEST(EqualFrequency, CountsAreWhatTheCutsGive)
{
    for (unsigned int seed = 1; seed <= 4000; ++seed)
    {
        Dice dice(seed);
        const int numTuples = 1 + dice.Below(60);
        const std::vector<double> values = RandomValues(dice, seed, numTuples);
        const bool isExact = seed % 2 == 0;
        std::vector<double> weights;
        for (std::size_t i = 0; i < values.size(); ++i)
            weights.push_back(isExact ? 0.25 * (1 + dice.Below(3)) : 0.01 + dice.Fraction());

        for (const int numberOfBins : {2, 3, 2 + dice.Below(12), numTuples, 1000})
        {
            for (const bool closed : {true, false})
            {
                SCOPED_TRACE("seed " + std::to_string(seed) + ", bins " + std::to_string(numberOfBins) + ", closed " +
                             std::to_string(closed));
                ExpectCountsAreWhatTheCutsGive(values, weights, numberOfBins, closed,
                                               isExact ? 0.0 : 1e-12 * numTuples);
                if (testing::Test::HasFailure())
                    return;
            }
        }
    }
}
