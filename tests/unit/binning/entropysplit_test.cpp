#include "binning/binalgorithm.h"
#include "binning/entropy.h"
#include "binning/entropysplit.h"
#include "tests/oracle/plainsplit.h"
#include "tests/support/hostdata.h"

#include <gtest/gtest.h>

#include <cmath>

namespace
{

using Rows = std::vector<std::vector<double>>;

/// The row values 1, 2, 3, ...
std::vector<double> ValuesFor(const Rows& rows)
{
    std::vector<double> values;
    for (std::size_t row = 0; row < rows.size(); ++row) values.push_back(static_cast<double>(row) + 1.0);
    return values;
}

std::set<double> CutPoints(const Rows& rows, bool rightBorderClosed)
{
    std::vector<double> table;
    for (const auto& row : rows) table.insert(table.end(), row.begin(), row.end());
    std::set<double> cutPoints;
    EXPECT_TRUE(FindCutPoints(ValuesFor(rows), table, rows.front().size(), rightBorderClosed, 0,
                              static_cast<int>(rows.size()) - 1, cutPoints)
                    .IsOK());
    return cutPoints;
}

std::set<double> PlainCutPoints(const Rows& rows, bool rightBorderClosed)
{
    return PlainSplit(ValuesFor(rows), rows, rightBorderClosed).CutPoints();
}

/// What a random table's cells hold.
enum class Cells
{
    kWhole,
    kFractional,
    kTinyTotal, ///< the ranges weigh about 1 to 2
    kFarApart,  ///< of very different magnitude
    kSixteenths,
    kFineGrid, ///< multiples of 2^-40, of about 1
    kMixedGrid ///< multiples of 2^-10, of very different magnitude
};

double RandomWeight(Dice& dice, Cells kind)
{
    switch (kind)
    {
    case Cells::kWhole:
        return 1 + dice.Below(6);
    case Cells::kFractional:
        return 0.01 + dice.Fraction() * 3;
    case Cells::kTinyTotal:
        return 0.25 * (1 + dice.Below(3));
    case Cells::kSixteenths:
        return 0.0625 * (1 + dice.Below(60));
    case Cells::kFineGrid:
        return std::ldexp(std::floor((0.5 + dice.Fraction()) * 0x1p40), -40);
    case Cells::kMixedGrid:
        return std::ldexp(1 + dice.Below(1000), dice.Below(20) - 10);
    case Cells::kFarApart:
        break;
    }
    return std::ldexp(1.0 + dice.Fraction(), dice.Below(120) - 60);
}

/// Rows that lean to a category which changes every `numAlike` rows or so, with runs of pure rows and some empty ones.
Rows RandomRows(Dice& dice, int numRows, int numCategories, Cells kind, int numAlike = 4)
{
    Rows rows;
    int leaning = 0;
    for (int i = 0; i < numRows; ++i)
    {
        if (dice.Below(numAlike) == 0)
            leaning = dice.Below(numCategories);
        std::vector<double> row(static_cast<std::size_t>(numCategories), 0.0);
        if (dice.Below(8) != 0)
            row[static_cast<std::size_t>(leaning)] = RandomWeight(dice, kind);
        if (dice.Below(3) == 0)
            row[static_cast<std::size_t>(dice.Below(numCategories))] += RandomWeight(dice, kind);
        rows.push_back(row);
    }
    return rows;
}

/// Multiplies all cells by 2^exponent.
void Scale(Rows& rows, int exponent)
{
    for (std::vector<double>& row : rows)
    {
        for (double& cell : row) cell = std::ldexp(cell, exponent);
    }
}

/// A row with a heavy cell of the first category, and 148 rows with one unit each: of two categories in turns of 37
/// rows, of more categories 100 of the first, and one of each other.
Rows RowsOfUnits(int numCategories, double heavy)
{
    const auto numCells = static_cast<std::size_t>(numCategories);
    Rows rows(149, std::vector<double>(numCells, 0.0));
    rows[0][0] = heavy;
    for (std::size_t i = 0; i < 148; ++i)
    {
        const std::size_t moreThanTwo = i < 100 ? 0 : i - 99;
        rows[i + 1][numCategories == 2 ? i / 37 % 2 : moreThanTwo] = 1.0;
    }
    return rows;
}

} // namespace

TEST(EntropySplit, WorkedFiguresOfTheCriterion)
{
    struct Case
    {
        double fMajor, fMinor, fPartition, fDelta;
        bool fIsSplit;
    };
    // The fourth would pass with the categories counted once: log2(3^2 - 2) in place of log2(3^4 - 2).
    for (const Case& c : {Case{1, 0, 0.0, 0.807355, true}, Case{10, 0, 0.0, 0.807355, true},
                          Case{14, 3, 0.672295, 4.992960, true}, Case{13, 3, 0.696212, 5.088630, false}})
    {
        SCOPED_TRACE(c.fMajor);
        const std::vector<double> left{c.fMajor + c.fMinor, c.fMajor, c.fMinor};
        const std::vector<double> right{c.fMajor + c.fMinor, c.fMinor, c.fMajor};
        const std::vector<double> both{2 * (c.fMajor + c.fMinor), c.fMajor + c.fMinor, c.fMajor + c.fMinor};

        EXPECT_EQ(1.0, Entropy(both));
        EXPECT_NEAR(c.fPartition, PartitionEntropy(left, right), 1e-6);
        EXPECT_NEAR(c.fDelta, MDLDelta(left, right, 1.0), 1e-6);
        const Rows rows{{c.fMajor, c.fMinor}, {c.fMinor, c.fMajor}};
        EXPECT_EQ(c.fIsSplit ? std::set<double>{1.0} : std::set<double>{}, CutPoints(rows, true));
        EXPECT_EQ(c.fIsSplit ? std::set<double>{2.0} : std::set<double>{}, CutPoints(rows, false));
    }
}

TEST(EntropySplit, TablesThatGiveNoCut)
{
    const std::vector<Rows> tables{
        {{5, 5}},               // one row
        {{1000, 0}, {1000, 0}}, // pure in one category
        {{1, 1}, {2, 2}},       // no information
        {{7}, {9}, {4}},        // one category
        {{0.3, 0}, {0, 0.3}},   // lighter than 1: the logarithm of a negative number
        {{0, 0}, {0, 0}},       // no weight at all
    };
    for (const Rows& rows : tables)
    {
        SCOPED_TRACE(testing::PrintToString(rows));
        EXPECT_TRUE(CutPoints(rows, true).empty());
        EXPECT_TRUE(CutPoints(rows, false).empty());
    }
}

TEST(EntropySplit, WeightOfExactlyOneAlwaysPasses)
{
    // log2(1 - 1) is minus infinity, and so is the threshold.
    EXPECT_EQ(std::set<double>{1.0}, CutPoints({{0.5, 0}, {0, 0.5}}, true));
    EXPECT_EQ(std::set<double>{2.0}, CutPoints({{0.5, 0}, {0, 0.5}}, false));
}

TEST(EntropySplit, LightRangeIsCutBetweenRowsThoughACutBesideAllRowsIsAsGood)
{
    // With the border open the cut in front of all rows comes first, gains as much, and would bring the range back.
    for (const Rows& rows : {Rows{{0, 0}, {1, 0}}, Rows{{0.25, 0.25}, {0.25, 0.25}}})
    {
        EXPECT_EQ(std::set<double>{1.0}, CutPoints(rows, true));
        EXPECT_EQ(std::set<double>{2.0}, CutPoints(rows, false));
    }
    // A gain of 0 pays for the cut beside all rows, with one entropy to tell, but not for one with two.
    EXPECT_TRUE(CutPoints({{0.275, 0.275}, {0.275, 0.275}}, false).empty());
}

TEST(EntropySplit, EmptyRowIsCutOffWhereTheGainOfRoundingExceedsTheThreshold)
{
    // The entropy times the weight, divided by the weight again, is an ulp below the entropy; the threshold is 1e-297.
    EXPECT_EQ(std::set<double>{1.0}, CutPoints({{0, 0}, {1e300, 3e300}}, true));
    EXPECT_EQ(std::set<double>{1.0}, PlainCutPoints({{0, 0}, {1e300, 3e300}}, true));
}

TEST(EntropySplit, LowestOfEqualRowsIsCut)
{
    // The cuts behind the first and behind the second row are mirror images.
    EXPECT_EQ(*PlainCutPoints({{40, 0}, {20, 20}, {0, 40}}, true).begin(), 1.0);
    EXPECT_EQ(*CutPoints({{40, 0}, {20, 20}, {0, 40}}, true).begin(), 1.0);
}

TEST(EntropySplit, MisfittingTablesAreErrors)
{
    const MCBinning::MCStatus badTable(MCBinning::BINStatusBadBinTable, false);
    const std::vector<double> values{1, 2};
    const std::vector<double> table{1, 0, 0, 1, 5, 5};
    std::set<double> cutPoints{42.0};

    EXPECT_EQ(badTable, FindCutPoints(values, table, 2, true, 0, 1, cutPoints));
    const BINAlgorithm algorithm{BINSettings(), BINVarList()};
    EXPECT_EQ(badTable, algorithm.FindCutPoints(nullptr, &table, 0, 1, cutPoints));
    EXPECT_EQ(badTable, algorithm.FindCutPoints(&values, nullptr, 0, 1, cutPoints));
    EXPECT_EQ(std::set<double>{42.0}, cutPoints);
}

namespace
{

/// Compares the real split with the plain one on a random table, in both border modes. \return whether there was a cut.
bool EqualsThePlainForm(const Rows& rows, const std::string& what)
{
    bool hasCut = false;
    for (const bool rightBorderClosed : {true, false})
    {
        const std::set<double> plain = PlainCutPoints(rows, rightBorderClosed);
        EXPECT_EQ(plain, CutPoints(rows, rightBorderClosed)) << what << " closed " << rightBorderClosed;
        hasCut = hasCut || !plain.empty();
    }
    return hasCut;
}

/// A mirror image behind the rows: every cut has a twin of equal entropy.
void Mirror(Rows& rows)
{
    for (std::size_t row = rows.size(); row > 0; --row) rows.push_back(rows[row - 1]);
}

/// Takes one category after the other out of the later rows: where sums round, something is left of it to their end,
/// above or below 0.
void UseUp(Rows& rows)
{
    for (std::size_t row = 0; row < rows.size(); ++row)
    {
        const std::size_t numUsedUp = row * rows[row].size() / rows.size();
        std::fill_n(rows[row].begin(), numUsedUp, 0.0);
    }
}

std::string CaseName(Cells kind, unsigned int seed)
{
    return "kind " + std::to_string(static_cast<int>(kind)) + " seed " + std::to_string(seed);
}

} // namespace

TEST(EntropySplit, EqualsThePlainFormOnSmallTables)
{
    int numWithCuts = 0;
    int numCases = 0;
    for (const Cells kind : {Cells::kWhole, Cells::kFractional, Cells::kTinyTotal, Cells::kFarApart})
    {
        for (unsigned int seed = 1; seed <= 1000; ++seed, ++numCases)
        {
            Dice dice(seed);
            const int numCategories = seed % 50 == 0 ? 256 : 1 + dice.Below(seed % 5 == 0 ? 20 : 4);
            const int numRows = kind == Cells::kTinyTotal ? 2 + dice.Below(4) : 2 + dice.Below(60);
            Rows rows = RandomRows(dice, numRows, numCategories, kind);
            if (seed % 7 == 0)
                Mirror(rows);
            numWithCuts += EqualsThePlainForm(rows, CaseName(kind, seed)) ? 1 : 0;
        }
    }
    EXPECT_GT(numWithCuts, numCases / 4) << "the tables are too dull to tell anything";
}

TEST(EntropySplit, EqualsThePlainFormOnTablesLongEnoughForBounds)
{
    for (const Cells kind : {Cells::kWhole, Cells::kFractional, Cells::kTinyTotal, Cells::kFarApart, Cells::kSixteenths,
                             Cells::kFineGrid, Cells::kMixedGrid})
    {
        for (unsigned int seed = 1; seed <= 80; ++seed)
        {
            Dice dice(seed);
            const int numCategories = seed % 40 == 0 ? 100 : 2 + dice.Below(seed % 5 == 0 ? 12 : 3);
            Rows rows = RandomRows(dice, 64 + dice.Below(500), numCategories, kind);
            if (seed % 3 == 0)
                UseUp(rows);
            if (seed % 4 == 0)
                dice.Shuffle(rows); // noise: no cut stands out
            if (seed % 7 == 0)
                Mirror(rows);
            EqualsThePlainForm(rows, CaseName(kind, seed));
        }
    }
}

TEST(EntropySplit, EqualsThePlainFormOnTablesOfLongSegments)
{
    for (const Cells kind : {Cells::kWhole, Cells::kFractional})
    {
        for (const int numRows : {39999, 40000}) // the last with short segments, and the first with long ones
        {
            Dice dice(static_cast<unsigned int>(numRows));
            Rows rows = RandomRows(dice, numRows, 4, kind, numRows / 10);
            UseUp(rows);
            EXPECT_TRUE(EqualsThePlainForm(rows, CaseName(kind, static_cast<unsigned int>(numRows))));
        }
    }
}

TEST(EntropySplit, EqualsThePlainFormWhereSumsCeaseToBeExact)
{
    // 148 cells of one unit and a heavy one, which brings the total to below, to exactly, or to above 2^53 units. Where
    // the heavy cell alone is 2^53, a sum loses the units behind it one by one, and comes out as 2^53 if no category
    // but the heavy one has more than a unit.
    for (const int exponent : {0, -4, -40})
    {
        for (const int heavy : {-400, -149, -148, -147, 0})
        {
            for (const int numCategories : {2, 49})
            {
                Rows rows = RowsOfUnits(numCategories, 0x1p53 + heavy);
                Scale(rows, exponent);
                EqualsThePlainForm(rows, "exponent " + std::to_string(exponent) + " heavy " + std::to_string(heavy) +
                                             " categories " + std::to_string(numCategories));
            }
        }
    }
}

TEST(EntropySplit, EqualsThePlainFormAtTheEndsOfTheRange)
{
    int numWithCuts = 0;
    for (const Cells kind : {Cells::kWhole, Cells::kFractional})
    {
        for (const int exponent : {-1070, -1000, -60, -12, 48, 60, 500, 1000, 1003, 1006, 1009})
        {
            for (unsigned int seed = 1; seed <= 6; ++seed)
            {
                Dice dice(seed);
                Rows rows = RandomRows(dice, 200 + dice.Below(300), 2 + dice.Below(3), kind, 40);
                UseUp(rows);
                Scale(rows, exponent);
                const std::string what = CaseName(kind, seed) + " exponent " + std::to_string(exponent);
                numWithCuts += EqualsThePlainForm(rows, what) ? 1 : 0;
            }
        }
    }
    EXPECT_GT(numWithCuts, 80) << "the tables are too dull to tell anything";
}
