#include <mcobnqrt/binoutput.h>
#include <mcobnqrt/efbinoutput.h>

#include <gtest/gtest.h>

#include <set>
#include <sstream>
#include <utility>
#include <vector>

using MCBinning::MCStatus;
using Values = std::vector<double>;

namespace
{

const MCStatus kBadIndex(MCBinning::BINStatusIndexOutOfRange, false);
const MCStatus kNoResults(MCBinning::BINStatusNoResults, false);
const MCStatus kWarning(MCBinning::BINStatusNoCutPoints, true);
const MCStatus kError(MCBinning::BINStatusTargetUnusable, false);

MCStatus Add(BINOutput& output, int attribute, int target, MCStatus status = MCStatus(),
             const std::set<double>& cutPoints = {}, const Values& cells = {})
{
    return output.SetAttributeTargetResults(status, cutPoints, cells, attribute, target, 6, 10.5, 12.0, -1.0, 8.0,
                                            0.25);
}

MCStatus AddEF(EFBINOutput& output, int attribute, MCStatus status = MCStatus(), const Values& cutPoints = {},
               const Values& cells = {})
{
    return output.SetAttributeResults(status, cutPoints, cells, attribute, 6, 10.5, 12.0, -1.0, 8.0);
}

} // namespace

TEST(SupervisedOutput, CutsTheFlatTableIntoOneRowForEachBin)
{
    const struct
    {
        std::set<double> fCutPoints;
        Values fCells;
        std::vector<Values> fRows;
    } cases[] = {{{5.0, 1.0}, {1, 2, 3, 4, 5, 6, 7, 8, 9}, {{1, 2, 3}, {4, 5, 6}, {7, 8, 9}}},
                 {{5.0}, {1, 2, 3, 4, 5}, {{1, 2}, {3, 4}}},
                 {{}, {}, {{}}}};
    for (const auto& given : cases)
    {
        BINOutput output;
        EXPECT_TRUE(Add(output, 0, 1, MCStatus(), given.fCutPoints, given.fCells).IsOK());

        BINAttributeTargetResults results;
        EXPECT_TRUE(output.GetAttributeTargetCutPoints(0, 1, results).IsOK());
        EXPECT_EQ(given.fRows, results.GetCellCounts());
        EXPECT_EQ(Values(given.fCutPoints.begin(), given.fCutPoints.end()), results.GetCutPoints());
    }
}

TEST(SupervisedOutput, FindsTheFirstEntryOfAPairAndAllOfAnAttribute)
{
    BINOutput output;
    EXPECT_TRUE(Add(output, 3, 1).IsOK());
    EXPECT_TRUE(Add(output, 4, 1, kError).IsOK());
    EXPECT_TRUE(Add(output, 3, 2, kWarning).IsOK());
    EXPECT_TRUE(Add(output, 3, 1, kError).IsOK()); // a second run on the pair

    BINAttributeTargetResults pair;
    EXPECT_TRUE(output.GetAttributeTargetCutPoints(3, 2, pair) == kWarning);
    EXPECT_TRUE(output.GetAttributeTargetCutPoints(3, 1, pair).IsOK());
    EXPECT_TRUE(pair.GetStatus().IsOK());

    std::vector<BINAttributeTargetResults> results(1);
    EXPECT_TRUE(output.GetAttributeCutPoints(3, results) == kError);
    ASSERT_EQ(4U, results.size()); // behind the one that was there
    EXPECT_EQ(-1, results[0].GetAttributeIndex());
    EXPECT_EQ(2, results[2].GetTargetIndex());

    EXPECT_TRUE(output.GetAllCutPoints(results).IsOK());
    ASSERT_EQ(4U, results.size()); // instead of those that were there
    EXPECT_EQ(4, results[1].GetAttributeIndex());
}

TEST(SupervisedOutput, RefusesWhatIsNoPairAndLeavesTheArgumentAlone)
{
    BINOutput output;
    std::vector<BINAttributeTargetResults> several(2);
    for (const auto& [attribute, target] : {std::pair(-1, 0), std::pair(0, -1), std::pair(3, 3)})
        EXPECT_TRUE(Add(output, attribute, target) == kBadIndex);
    EXPECT_TRUE(output.GetAllCutPoints(several) == kNoResults);

    Add(output, 3, 1);
    BINAttributeTargetResults one;
    for (const auto& [attribute, target] : {std::pair(-1, 1), std::pair(3, 3), std::pair(1, 3)})
        EXPECT_TRUE(output.GetAttributeTargetCutPoints(attribute, target, one) == kBadIndex);
    EXPECT_TRUE(output.GetAttributeCutPoints(-1, several) == kBadIndex);
    EXPECT_TRUE(output.GetAttributeCutPoints(1, several) == kBadIndex);
    EXPECT_EQ(-1, one.GetAttributeIndex());
    EXPECT_EQ(2U, several.size());
}

TEST(SupervisedOutput, IsAssignedWithBothItsEntriesAndTheirIndex)
{
    BINOutput output, assigned;
    Add(output, 3, 1);
    Add(assigned, 7, 8);
    assigned = output;
    Add(output, 5, 1);

    BINAttributeTargetResults results;
    EXPECT_TRUE(assigned.GetAttributeTargetCutPoints(3, 1, results).IsOK());
    EXPECT_TRUE(assigned.GetAttributeTargetCutPoints(7, 8, results) == kBadIndex);
    EXPECT_TRUE(assigned.GetAttributeTargetCutPoints(5, 1, results) == kBadIndex);
    std::vector<BINAttributeTargetResults> several;
    EXPECT_TRUE(assigned.GetAttributeCutPoints(3, several).IsOK());
    EXPECT_TRUE(assigned.GetAttributeCutPoints(7, several) == kBadIndex);
}

TEST(EqualFrequencyOutput, IsAssignedWithBothItsEntriesAndTheirIndex)
{
    EFBINOutput output, assigned;
    AddEF(output, 3);
    AddEF(assigned, 7);
    assigned = output;
    AddEF(output, 5);

    BINAttributeResults results;
    EXPECT_TRUE(assigned.GetAttributeCutPoints(3, results).IsOK());
    EXPECT_TRUE(assigned.GetAttributeCutPoints(7, results) == kBadIndex);
    EXPECT_TRUE(assigned.GetAttributeCutPoints(5, results) == kBadIndex);
}

TEST(EqualFrequencyOutput, FindsTheFirstEntryAndRefusesIndicesByTwoCodes)
{
    EFBINOutput output;
    std::vector<BINAttributeResults> all(5);
    EXPECT_TRUE(AddEF(output, -1) == MCStatus(MCBinning::BINStatusBadAttributeIndex, false));
    EXPECT_TRUE(output.GetAllCutPoints(all) == kNoResults);
    EXPECT_TRUE(AddEF(output, 2, kError, {3.0, 1.0}, {4.0}).IsOK());
    EXPECT_TRUE(AddEF(output, 2).IsOK());

    BINAttributeResults one;
    EXPECT_TRUE(output.GetAttributeCutPoints(-1, one) == kBadIndex);
    EXPECT_TRUE(output.GetAttributeCutPoints(3, one) == kBadIndex);
    EXPECT_EQ(-1, one.GetAttributeIndex());
    EXPECT_TRUE(output.GetAttributeCutPoints(2, one) == kError);
    EXPECT_EQ((Values{3.0, 1.0}), one.GetCutPoints());
    EXPECT_EQ(Values{4.0}, one.GetCellCounts());
    EXPECT_TRUE(output.GetAllCutPoints(all).IsOK());
    EXPECT_EQ(2U, all.size());
}

TEST(Outputs, DisplayEachEntryWithAllItsFigures)
{
    BINOutput supervised;
    Add(supervised, 3, 1, kWarning, {2.5}, {4, 1, 3, 6.5, 5, 1.5});
    EFBINOutput equalFrequency;
    AddEF(equalFrequency, 2);
    std::ostringstream supervisedText, equalFrequencyText;

    supervised.Display(supervisedText);
    equalFrequency.Display(equalFrequencyText);

    EXPECT_EQ("\nStart of BINOutput display\ncut point :"
              "\nStart of BINAttributeTargetResults display\nBINDataTuple   attribute = 3\ntarget = 1\n"
              "Number of distinct values = 6\nTotal weight = 10.5\nTotal weight with missing = 12\nMinimum = -1\n"
              "Maximum = 8\nModel Entropy = 0.25\nStatus has error code 120017\n"
              "Number of cutpoints = 1, the cutpoints:\n2.5\nThe CellCounts are\n4  1  3  \n6.5  5  1.5  \n"
              "\nEnd of BINAttributeTargetResults display\n\nEnd of BINOutput display\n",
              supervisedText.str());
    EXPECT_EQ("\nStart of EFBINOutput display\ncut point :"
              "\nStart of BINAttributeResults display\nBINDataTuple   attribute = 2\n"
              "Number of distinct values = 6\nTotal weight = 10.5\nTotal weight with missing = 12\nMinimum = -1\n"
              "Maximum = 8\nNumber of cutpoints = 0\nThe CellCounts are\n\n"
              "End of BINAttributeResults display\n\nEnd of EFBINOutput display\n",
              equalFrequencyText.str());
}
