#include "tests/support/runs.h"
#include "tests/support/tempdir.h"

#include <gtest/gtest.h>

#include <sstream>

using MCBinning::MCStatus;
using MCMV::gMissingValue;

namespace
{

const MCStatus kFlagged(MCBinning::BINStatusSomeResultsFlagged, true);

MCStatus ErrorOf(MCBinning::BINStatusCode code)
{
    return MCStatus(code, false);
}

/// Fields of a record: x, target, weight, y. x separates the categories at 2, y doesn't.
BINVarList FullList()
{
    return AVarList().WithAttribute("x").WithTarget("t", 2).WithWeight().WithAttribute("y");
}

RecordTable FullRecords()
{
    return {{1, 0, 3, 1}, {2, 0, 3, 2}, {3, 1, 3, 1}, {4, 1, 3, 2}, {gMissingValue, 1, 2, 1}};
}

} // namespace

TEST(SupervisedRun, GivesTheWholeResultOfAPair)
{
    Supervised run(FullList());
    RecordTable records = FullRecords();

    EXPECT_TRUE(run.Run(records, {0}).IsOK());

    const BINAttributeTargetResults result = run.Pair(0, 1);
    EXPECT_EQ(std::vector<double>{2}, result.GetCutPoints());
    EXPECT_EQ((std::vector<std::vector<double>>{{6, 6, 0}, {6, 0, 6}}), result.GetCellCounts());
    EXPECT_EQ(4U, result.GetNDistinctValues());
    EXPECT_EQ(12.0, result.GetTotalWeight());
    EXPECT_EQ(14.0, result.GetTotalWeightWithMissing());
    EXPECT_EQ(1.0, result.GetMinimum());
    EXPECT_EQ(4.0, result.GetMaximum());
    EXPECT_EQ(0.0, result.GetModelEntropy());
    EXPECT_TRUE(run->GetStatus().IsOK());
}

TEST(SupervisedRun, WithoutListsTreatsAllButTargetAndWeight)
{
    Supervised run(FullList());
    RecordTable records = FullRecords();

    EXPECT_EQ(kFlagged, run.Run(records));

    const std::vector<BINAttributeTargetResults> results = run.All();
    ASSERT_EQ(2U, results.size());
    EXPECT_EQ(0, CodeOf(results[0]));
    EXPECT_EQ(3, results[1].GetAttributeIndex());
    EXPECT_EQ(MCBinning::BINStatusNoCutPoints, CodeOf(results[1]));
    EXPECT_EQ(results[1].GetStatus(), run->GetStatus());
}

TEST(SupervisedRun, RefusesBeforeItTouchesTheSource)
{
    BINSettings withoutBins;
    Supervised unset(FullList(), withoutBins);
    RecordTable records = FullRecords();
    EXPECT_EQ(ErrorOf(MCBinning::BINStatusBadNumberOfBins), unset.Run(records));

    Supervised run(FullList());
    const std::vector<int> one{0};
    const MCStatus noPairs = ErrorOf(MCBinning::BINStatusNoValidPairs);
    EXPECT_EQ(noPairs, run.Run(records, {}));
    EXPECT_EQ(noPairs, run.Run(records, {0, 3}, {1}));
    EXPECT_EQ(noPairs, run->Run(&records, nullptr, &one));
    EXPECT_EQ(noPairs, run.Run(records, {1, 2, -1, 4}));
    EXPECT_EQ(ErrorOf(MCBinning::BINStatusNoRecords), run->Run(nullptr, nullptr, nullptr));
    EXPECT_EQ(0, records.fNumHasNext);

    EXPECT_TRUE(run.Run(records, {0}).IsOK()) << "none of these spoils the object";
}

TEST(SupervisedRun, RefusedEntriesCarryTheirVerdict)
{
    Supervised run(AVarList().WithAttribute("x").WithTarget("t", 2).WithWeight().WithCategorical("c", 2));
    RecordTable records{{1, 0, 3, 0}, {2, 0, 3, 0}, {3, 1, 3, 1}, {4, 1, 3, 1}};

    EXPECT_TRUE(run.Run(records, {0, 2, 1, 99, 0, 0, 2, -1, 0}, {1, 1, 1, 1, 0, 2, 0, 1, 3}).IsOK());

    std::vector<std::vector<long>> stored;
    for (const BINAttributeTargetResults& result : run.All())
        stored.push_back({result.GetAttributeIndex(), result.GetTargetIndex(), CodeOf(result)});
    EXPECT_EQ((std::vector<std::vector<long>>{{0, 1, 0},
                                              {2, 1, MCBinning::BINStatusRoleConflict},
                                              {99, 1, MCBinning::BINStatusIndexOutOfRange},
                                              {0, 2, MCBinning::BINStatusTargetNotCategorical},
                                              {2, 0, MCBinning::BINStatusTargetNotCategorical},
                                              {0, 3, 0}}),
              stored)
        << "entries of equal or negative indices leave no trace";
    EXPECT_EQ(0.0, run.Pair(2, 1).GetMinimum());
    EXPECT_TRUE(run->GetStatus().IsOK()) << "a verdict is no status of the run";
}

TEST(SupervisedRun, WarningsOfAPairReplaceEachOther)
{
    // x: several values; one: a single value; none: no value. t has two categories in the data, u a single one.
    Supervised run(
        AVarList().WithAttribute("one").WithAttribute("none").WithAttribute("x").WithTarget("t", 2).WithCategorical("u",
                                                                                                                    2));
    RecordTable records{{5, gMissingValue, 1, 0, 0}, {5, gMissingValue, 2, 1, 0}};

    EXPECT_EQ(kFlagged, run.Run(records, {0, 1, 0, 2}, {3, 3, 4, 4}));

    const auto warning = [&](int attribute, int target) { return run.Pair(attribute, target).GetStatus(); };
    EXPECT_EQ(MCBinning::BINStatusSingleValueAttribute, warning(0, 3).GetErrorCode());
    EXPECT_EQ(0, warning(0, 3).GetDiscreteDatum(0));
    EXPECT_EQ(MCBinning::BINStatusNoValidValues, warning(1, 3).GetErrorCode());
    EXPECT_EQ(MCBinning::BINStatusSingleCategoryTarget, warning(0, 4).GetErrorCode()) << "hides the single value";
    EXPECT_EQ(4, warning(2, 4).GetDiscreteDatum(0));
    EXPECT_TRUE(warning(2, 4).IsWarning());
    EXPECT_EQ(warning(2, 4), run->GetStatus()) << "the last that was not OK";
}

TEST(SupervisedRun, LaterRunsWorkFromTheSpooledData)
{
    Supervised run(FullList());
    RecordTable records = FullRecords();
    run.Run(records, {0});
    const int numAsked = records.fNumHasNext;

    EXPECT_EQ(kFlagged, run.Run(records, {3}));
    EXPECT_EQ(kFlagged, run->Run(nullptr, nullptr, nullptr)) << "once flagged, always flagged";

    EXPECT_EQ(numAsked, records.fNumHasNext);
    const std::vector<BINAttributeTargetResults> results = run.All();
    ASSERT_EQ(4U, results.size());
    ExpectSame(results[0], results[2]);
    ExpectSame(results[1], results[3]);
}

TEST(SupervisedRun, SettingsOfTheAlgorithmReachLaterRunsAndThoseOfTheHostDont)
{
    BINSettings settings = SupervisedSettings();
    Supervised run(FullList(), settings);
    settings.SetNumberOfBins(2);
    EXPECT_EQ(10, run->GetSettings()->GetNumberOfBins());
    run->GetSettings()->SetRightBorderClosed(false);
    RecordTable records = FullRecords();

    EXPECT_TRUE(run.Run(records, {0}).IsOK());
    run->GetSettings()->SetRightBorderClosed(true); // too late: the data are prepared
    EXPECT_TRUE(run.Run(records, {0}).IsOK());

    EXPECT_EQ(std::vector<double>{3}, run.All()[0].GetCutPoints());
    EXPECT_EQ(std::vector<double>{3}, run.All()[1].GetCutPoints());
    EXPECT_EQ((std::vector<std::vector<double>>{{6, 6, 0}, {6, 0, 6}}), run.All()[0].GetCellCounts());
}

TEST(SupervisedRun, ListsWithoutATarget)
{
    const BINVarList list = AVarList().WithAttribute("x").WithCategorical("c", 2);
    RecordTable records{{1, 0}, {2, 0}, {3, 1}, {4, 1}};

    Supervised without(list);
    EXPECT_EQ(ErrorOf(MCBinning::BINStatusTargetUnusable), without.Run(records));
    EXPECT_EQ(kFlagged, without.Run(records, {0}));
    EXPECT_TRUE(without.All().empty());
    EXPECT_EQ(kFlagged, without.Run(records, {0}, {1}));
    EXPECT_EQ(std::vector<double>{2}, without.Pair(0, 1).GetCutPoints()) << "pairs need no target of the list";
}

TEST(SupervisedRun, TargetsThatDontFitTheirCodes)
{
    // A code beyond the declared categories: the target's file is whole, so it is no attribute's fault.
    Supervised undeclared(AVarList().WithAttribute("x").WithTarget("t", 2).WithCategorical("c", 2));
    RecordTable records{{1, 5, 0}, {2, 0, 1}};
    EXPECT_EQ(ErrorOf(MCBinning::BINStatusTargetUnusable), undeclared.Run(records));
    EXPECT_EQ(kFlagged, undeclared.Run(records, {0}));
    EXPECT_EQ(MCBinning::BINStatusTargetUnusable, CodeOf(undeclared.Pair(0, 1)));
    EXPECT_EQ(gMissingValue, undeclared.Pair(0, 1).GetMinimum());
    undeclared.Run(records, {1}, {2});
    EXPECT_EQ(2U, undeclared.Pair(1, 2).GetNDistinctValues());

    // A code beyond 255 cuts the file short: no attribute, and with nothing else to bin against no run.
    Supervised cutShort(AVarList().WithAttribute("x").WithTarget("t", 300).WithCategorical("c", 2));
    RecordTable tooMany{{1, 0, 0}, {2, 256, 1}};
    EXPECT_EQ(kFlagged, cutShort.Run(tooMany, {0, 1}, {1, 2}));
    EXPECT_EQ(MCBinning::BINStatusTargetUnusable, CodeOf(cutShort.Pair(0, 1)));
    EXPECT_EQ(MCBinning::BINStatusTooManyCategories, CodeOf(cutShort.Pair(1, 2)));
    Supervised alone(AVarList().WithAttribute("x").WithTarget("t", 300));
    RecordTable sameTooMany{{1, 0}, {2, 256}};
    const MCStatus first = alone.Run(sameTooMany);
    EXPECT_EQ(MCBinning::BINStatusTooManyCategories, first.GetErrorCode());
    EXPECT_EQ(first, alone.Run(sameTooMany)) << "a failed preparation is not tried again";
}

TEST(SupervisedRun, CancelKeepsTheResultsFoundBefore)
{
    const MCStatus cancelled = ErrorOf(MCBinning::BINStatusCancelled);
    const TempDir directory; // a name that another program has taken would be one question more
    BINSettings settings = SupervisedSettings();
    settings.SetTempDirName(directory.Path());
    // Asked at creation, at the run, once a record, behind the pass, then twice a pair: the 10th is the end of the
    // first.
    CancelAfter query(10);
    settings.SetCancelPointer(&query);
    Supervised run(FullList(), settings);
    RecordTable records = FullRecords();

    EXPECT_EQ(cancelled, run.Run(records));
    EXPECT_EQ(1U, run.All().size());
    EXPECT_EQ(cancelled, run->GetStatus());
    EXPECT_EQ(cancelled, run.Run(records));
    EXPECT_EQ(10, query.fNumAsked);

    Supervised stopped(FullList());
    stopped->Cancel();
    RecordTable unread = FullRecords();
    EXPECT_EQ(cancelled, stopped.Run(unread));
    EXPECT_EQ(0, unread.fNumHasNext);
    EXPECT_EQ(ErrorOf(MCBinning::BINStatusNoValidPairs), stopped.Run(unread, {})) << "the lists are looked at first";
}

TEST(SupervisedRun, ReportsEveryAttributeThatIsTreatedWithoutAnError)
{
    BINVarList list = AVarList().WithTarget("t", 2);
    for (const char* name : {"a", "b", "c", "d", "e"}) list.AddContVar(name, "", IBINVariable::RoleAttribute);
    list.AddCatVar("bad", "", 2, IBINVariable::MeasureNumericCategorical, IBINVariable::RoleAttribute);
    RecordTable records{{0, 1, 1, 1, 1, 1, 300}, {1, 2, 2, 2, 2, 2, 0}};
    ReportLog everyOne;
    Supervised run(list);
    run->SetProgressListener(&everyOne);
    run.Run(records, {1, 6, 0, 2});
    EXPECT_EQ((std::vector<int>{1, 2}), everyOne.fIndices) << "neither the refused entry nor the error";

    ReportLog everyThird;
    run->SetProgressListener(&everyThird);
    run->GetSettings()->SetNSkippedAttReports(2);
    run.Run(records, {1, 2, 6, 3, 4, 5});
    EXPECT_EQ((std::vector<int>{3}), everyThird.fIndices) << "the error used up the count of the third";
    EXPECT_GE(everyThird.fSeconds.at(0), 0.0);
}

TEST(SupervisedRun, DisplayShowsWhatThereIs)
{
    Supervised run(FullList());
    std::ostringstream before;
    run->Display(before);
    EXPECT_EQ("\nStart of BINAlgorithm display\nRecord count: 0\nout result: \nStart of BINOutput display\n"
              "cut point :\nEnd of BINOutput display\nEnd of BINAlgorithm display\n",
              before.str());

    RecordTable records = FullRecords();
    run.Run(records, {0});
    std::ostringstream after;
    run->Display(after);
    EXPECT_NE(std::string::npos, after.str().find("Record count: 4\nout result: BINDataPreparator object: \n"));
    EXPECT_EQ(0U, run->GetVersionString().find("Supervised Binning Component Ver. 1.0 (MCOBNQRT "));
}
