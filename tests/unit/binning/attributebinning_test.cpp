#include "binning/celltable.h"
#include "tests/support/runs.h"

#include <gtest/gtest.h>

namespace
{

constexpr double kLargest = 1.7976931348623157e308;

/// The supervised result of one attribute from pairs of value and code.
BINAttributeTargetResults Bin(const std::vector<std::pair<double, int>>& data, BINSettings settings)
{
    RecordTable records;
    for (const auto& [value, code] : data) records.Add({value, static_cast<double>(code)});
    Supervised run(AVarList().WithAttribute("x").WithTarget("y", 3), settings);
    run.Run(records);
    return run.Pair(0, 1);
}

BINSettings Closed(bool right, int threshold = 0, int numberOfBins = 10)
{
    BINSettings settings;
    settings.SetRightBorderClosed(right);
    settings.SetNumDistinctValueThreshold(threshold);
    settings.SetNumberOfBins(numberOfBins);
    return settings;
}

using Table = std::vector<std::vector<double>>;

} // namespace

TEST(DirectBinning, WithoutACutThereIsOneBinWithItsEntropy)
{
    const BINAttributeTargetResults result = Bin({{1, 0}, {1, 1}, {2, 0}, {2, 1}}, Closed(true));

    EXPECT_EQ(MCBinning::BINStatusNoCutPoints, CodeOf(result));
    EXPECT_TRUE(result.GetStatus().IsWarning());
    EXPECT_EQ((Table{{4, 2, 2}}), result.GetCellCounts());
    EXPECT_EQ(1.0, result.GetModelEntropy());
}

TEST(DirectBinning, LargestNumberHasNoRowWithTheLeftBorderClosed)
{
    const std::vector<std::pair<double, int>> data{{1, 0}, {2, 0}, {kLargest, 1}, {kLargest, 1}};

    EXPECT_EQ(std::vector<double>{2}, Bin(data, Closed(true)).GetCutPoints());
    const BINAttributeTargetResults left = Bin(data, Closed(false));
    EXPECT_EQ(MCBinning::BINStatusBadBinTable, CodeOf(left));
    EXPECT_TRUE(left.GetStatus().IsWarning());
    EXPECT_EQ(MCMV::gMissingValue, left.GetModelEntropy());
    EXPECT_EQ((Table{{}}), left.GetCellCounts());
}

TEST(PreBinning, RowsAreThePercentiles)
{
    // Two bins of four: the cut between them at 4.5 is the only one there is to find, and not the true one at 2.
    const std::vector<std::pair<double, int>> data{{1, 0}, {2, 0}, {3, 1}, {4, 1}, {5, 1}, {6, 1}, {7, 1}, {8, 1}};

    EXPECT_EQ(std::vector<double>{2}, Bin(data, Closed(true, 8, 2)).GetCutPoints()) << "8 values are not above 8";
    EXPECT_EQ(MCBinning::BINStatusNoCutPoints, CodeOf(Bin(data, Closed(true, 7, 2))));
    EXPECT_EQ(std::vector<double>{2.5}, Bin(data, Closed(true, 7, 4)).GetCutPoints());
}

TEST(PreBinning, CutAtTheEndOfTheDataIsNoBorder)
{
    // The first or the last value alone holds more than one share.
    const std::vector<std::pair<double, int>> heavyEnd{{1, 0}, {2, 1}, {2, 1}, {2, 1}};
    const std::vector<std::pair<double, int>> heavyStart{{1, 0}, {1, 0}, {1, 0}, {2, 1}};

    EXPECT_EQ((Table{{4, 1, 3}}), Bin(heavyEnd, Closed(true, 1, 2)).GetCellCounts());
    EXPECT_EQ((Table{{4, 3, 1}}), Bin(heavyStart, Closed(false, 1, 2)).GetCellCounts());
}

TEST(PreBinning, EmptyRowStaysWithTheLeftBorderClosed)
{
    // Fifths of 1, 2, 2, 2, 3: the cuts 1.5 and 2, and no value from 1.5 up to 2.
    const std::vector<std::pair<double, int>> data{{1, 0}, {2, 1}, {2, 1}, {2, 1}, {3, 1}};

    const BINAttributeTargetResults result = Bin(data, Closed(false, 1, 5));

    double total = 0.0;
    for (const auto& row : result.GetCellCounts()) total += row[0];
    EXPECT_EQ(5.0, total);
    EXPECT_EQ(std::vector<double>{1.5}, result.GetCutPoints());
}

TEST(SmallBins, JoinTheNeighbourThatLeavesTheLowerEntropy)
{
    struct Case
    {
        const char* fWhat;
        double fThreshold;
        std::vector<double> fCells; ///< total, code 0, code 1 of each bin
        std::set<double> fCutPoints;
        std::vector<double> fTotals;
    };
    const std::vector<Case> cases{
        {"only the lighter of two small ones", 0.5, {10, 10, 0, 1, 0, 1, 3, 3, 0, 10, 0, 10}, {1, 3}, {10, 4, 10}},
        {"two equal ones protect each other", 1.0, {10, 10, 0, 1, 0, 1, 1, 1, 0, 10, 0, 10}, {1, 2, 3}, {10, 1, 1, 10}},
        {"equal entropies: to the left", 1.0, {2, 1, 1, 1, 1, 0, 2, 1, 1}, {2}, {3, 2}},
        {"outer bins are never small", 1.0, {1, 1, 0, 5, 0, 5, 1, 1, 0}, {1, 2}, {1, 5, 1}},
        {"two into one", 0.5, {50, 0, 50, 1, 1, 0, 20, 20, 0, 1, 1, 0, 50, 0, 50}, {1, 4}, {50, 22, 50}},
    };
    for (const Case& c : cases)
    {
        SCOPED_TRACE(c.fWhat);
        std::vector<double> cells = c.fCells;
        std::set<double> cutPoints;
        for (std::size_t cut = 1; cut < cells.size() / 3; ++cut) cutPoints.insert(static_cast<double>(cut));

        MergeSmallBins(c.fThreshold, 2, cells, cutPoints);

        std::vector<double> totals;
        for (std::size_t bin = 0; bin < cells.size() / 3; ++bin) totals.push_back(cells[3 * bin]);
        EXPECT_EQ(c.fCutPoints, cutPoints);
        EXPECT_EQ(c.fTotals, totals);
    }
}

TEST(CellTable, SumsTheRowsBetweenTheCutPoints)
{
    const std::vector<double> values{1, 2, 3};
    const std::vector<double> table{4, 0, 0, 2, 1, 1}; // two categories

    EXPECT_EQ((std::vector<double>{6, 4, 2, 2, 1, 1}), FillCells(values, table, 2, true, {2}));
    EXPECT_EQ((std::vector<double>{4, 4, 0, 4, 1, 3}), FillCells(values, table, 2, false, {2}));
    EXPECT_EQ((std::vector<double>{8, 5, 3}), FillCells(values, table, 2, true, {}));
}

TEST(CellTable, ModelEntropyIsTheMeanOverTheTotalWeight)
{
    EXPECT_EQ(0.5, ComputeModelEntropy({2, 1, 1, 2, 2, 0}, 2, 4.0));
    EXPECT_EQ(0.25, ComputeModelEntropy({2, 1, 1, 2, 2, 0}, 2, 8.0)) << "the total given, not that of the cells";
}
