#include "tests/support/runs.h"
#include "tests/support/tempdir.h"

#include <gtest/gtest.h>

#include <sstream>

using MCBinning::MCStatus;
using MCMV::gMissingValue;

namespace
{

const MCStatus kFlagged(MCBinning::BINStatusSomeResultsFlagged, true);

} // namespace

TEST(EqualFrequencyRun, GivesTheWholeResultOfAnAttribute)
{
    EqualFrequency run(AVarList().WithAttribute("x").WithWeight(), EqualFrequencySettings(2));
    RecordTable records{{4, 1}, {2, 1}, {1, 1}, {gMissingValue, 5}, {3, 1}};

    EXPECT_TRUE(run.Run(records).IsOK());

    const BINAttributeResults result = run.Attribute(0);
    EXPECT_EQ(std::vector<double>{2.5}, result.GetCutPoints());
    EXPECT_EQ((std::vector<double>{2, 2}), result.GetCellCounts());
    EXPECT_EQ(4U, result.GetNDistinctValues());
    EXPECT_EQ(4.0, result.GetTotalWeight());
    EXPECT_EQ(9.0, result.GetTotalWeightWithMissing());
    EXPECT_EQ(1.0, result.GetMinimum());
    EXPECT_EQ(4.0, result.GetMaximum());
}

TEST(EqualFrequencyRun, TargetIsAVariableLikeAnyOther)
{
    EqualFrequency run(AVarList().WithAttribute("x").WithTarget("t", 3).WithWeight(), EqualFrequencySettings(2));
    RecordTable records{{1, 0, 1}, {2, gMissingValue, 1}, {3, 1, 1}, {4, 2, 1}};

    EXPECT_TRUE(run.Run(records).IsOK());

    EXPECT_EQ(2U, run.All().size());
    EXPECT_EQ(4.0, run.Attribute(0).GetTotalWeight()) << "a missing target takes no record away";
    EXPECT_EQ(3U, run.Attribute(1).GetNDistinctValues());
    EXPECT_EQ(4.0, run.Attribute(1).GetTotalWeightWithMissing());
}

TEST(EqualFrequencyRun, WarningsOfAnAttributeReplaceEachOther)
{
    EqualFrequency run(AVarList().WithAttribute("none").WithAttribute("one").WithAttribute("heavy"),
                       EqualFrequencySettings(2));
    RecordTable records{{gMissingValue, 7, 1}, {gMissingValue, 7, 2}, {gMissingValue, 7, 2}, {gMissingValue, 7, 2}};

    EXPECT_EQ(kFlagged, run.Run(records));

    EXPECT_EQ(MCBinning::BINStatusNoValidValues, CodeOf(run.Attribute(0)));
    EXPECT_EQ(MCBinning::BINStatusSingleValueAttribute, CodeOf(run.Attribute(1)));
    EXPECT_EQ(1, run.Attribute(1).GetStatus().GetDiscreteDatum(0));
    EXPECT_EQ(MCBinning::BINStatusNoEFCutPoints, CodeOf(run.Attribute(2)));
    EXPECT_EQ(2, run.Attribute(2).GetStatus().GetDiscreteDatum(0));
    EXPECT_EQ(std::vector<double>{4}, run.Attribute(2).GetCellCounts());
    EXPECT_EQ(run.Attribute(2).GetStatus(), run->GetStatus());
}

TEST(EqualFrequencyRun, ListsAreCheckedEntryByEntry)
{
    EqualFrequency run(AVarList().WithAttribute("x").WithWeight().WithCategorical("cut", 2), EqualFrequencySettings(2));
    RecordTable records{{1, 1, 0}, {2, 1, 300}};
    const MCStatus badIndex(MCBinning::BINStatusBadAttributeIndex, false);
    EXPECT_EQ(badIndex, run.Run(records, {}));
    EXPECT_EQ(badIndex, run.Run(records, {1, -1, 3}));
    EXPECT_EQ(MCStatus(MCBinning::BINStatusNoRecords, false), run->Run(nullptr, nullptr));

    EXPECT_TRUE(run.Run(records, {1, -1, 99, 0}).IsOK());

    ASSERT_EQ(3U, run.All().size()) << "the negative entry leaves no trace";
    EXPECT_EQ(MCBinning::BINStatusRoleConflict, CodeOf(run.All()[0]));
    EXPECT_EQ(MCBinning::BINStatusBadAttributeIndex, CodeOf(run.All()[1]));
    EXPECT_EQ(0.0, run.All()[1].GetMaximum());
    EXPECT_EQ(0, CodeOf(run.All()[2]));
    EXPECT_EQ(kFlagged, run.Run(records, {2}));
    EXPECT_EQ(MCBinning::BINStatusTooManyCategories, CodeOf(run.Attribute(2)));
}

TEST(EqualFrequencyRun, CancelAndReportsGoAttributeByAttribute)
{
    CancelAfter query(7); // creation, run, two records, behind the pass, then twice an attribute: the end of the first
    ReportLog log;
    const TempDir directory; // a name that another program has taken would be one question more
    EFBINSettings settings = EqualFrequencySettings(2);
    settings.SetTempDirName(directory.Path());
    settings.SetCancelPointer(&query);
    settings.SetProgressListener(&log);
    EqualFrequency run(AVarList().WithAttribute("x").WithAttribute("y"), settings);
    RecordTable records{{1, 1}, {2, 2}};

    EXPECT_EQ(MCStatus(MCBinning::BINStatusCancelled, false), run.Run(records));

    EXPECT_EQ(1U, run.All().size());
    EXPECT_TRUE(log.fIndices.empty()) << "the step ended in an error";
}

TEST(EqualFrequencyRun, DisplayShowsWhatThereIs)
{
    EqualFrequency run(AVarList().WithAttribute("x"), EqualFrequencySettings(2));
    std::ostringstream before;
    run->Display(before);
    EXPECT_EQ("\nStart of EFBINAlgorithm display\nRecord count: 0\nout result: \nStart of EFBINOutput display\n"
              "cut point :\nEnd of EFBINOutput display\nEnd of EFBINAlgorithm display\n",
              before.str());
}
