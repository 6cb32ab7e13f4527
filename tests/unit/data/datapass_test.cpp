#include "tests/support/testpreparator.h"

#include <gtest/gtest.h>

#include <limits>
#include <tuple>

using MCMV::gMissingValue;

namespace
{

const double kNaN = std::numeric_limits<double>::quiet_NaN();
const double kInfinity = std::numeric_limits<double>::infinity();

/// Fields of a record: target, weight, attribute. A second categorical variable stands behind them.
BINVarList FullList(IBINVariable::BINWRoundingOption option = IBINVariable::RoundClosest)
{
    return AVarList().WithTarget("t", 256).WithWeight(option).WithAttribute("x").WithCategorical("c", 256);
}

MCCommon::Record RecordOf(const std::vector<double>& fields)
{
    MCCommon::Record record(static_cast<int>(fields.size()));
    for (std::size_t i = 0; i < fields.size(); ++i) record[static_cast<int>(i)] = fields[i];
    return record;
}

const MCBinning::MCStatus kNoRecords(MCBinning::BINStatusNoRecords, false);

} // namespace

TEST(DataPass, RecordsBecomeColumns)
{
    TestPreparator preparator(FullList());
    RecordTable source{{1, 2, 3.5, 0}, {-1, 1, gMissingValue, -1}, {gMissingValue, 1, -7, gMissingValue}, {}};

    EXPECT_TRUE(preparator->PrepareData(&source).IsOK());

    EXPECT_EQ(3U, preparator->GetNumRecords());
    EXPECT_EQ((std::vector<double>{1, gMissingValue, gMissingValue}), preparator.Values(0));
    EXPECT_EQ((std::vector<double>{2, 1, 1}), preparator.Values(1));
    EXPECT_EQ((std::vector<double>{3.5, gMissingValue, -7}), preparator.Values(2));
    EXPECT_EQ((std::vector<double>{0, gMissingValue, gMissingValue}), preparator.Values(3));
    EXPECT_EQ((std::vector<int>{1, 0, 0, 0}), preparator->GetMaxCodes());
    EXPECT_EQ(4, source.fNumNext);
    EXPECT_EQ(5, source.fNumHasNext);
}

TEST(DataPass, TurnsOneRecordIntoPositions)
{
    const BINVarList list = FullList();
    const RecordLayout layout(list);
    DataPass pass(list, layout, 1);
    MCCommon::Record processed(4);

    EXPECT_TRUE(pass.ProcessRecord(RecordOf({3, 2, 7.5, 1}), processed).IsOK());
    EXPECT_FALSE(pass.IsRecordDropped());
    EXPECT_EQ(7.5, processed[2]);
    EXPECT_EQ((std::vector<int>{3, 0, 0, 1}), pass.GetMaxCodes());
    EXPECT_TRUE(pass.ProcessRecord(RecordOf({3, 0, 7.5, 1}), processed).IsOK());
    EXPECT_TRUE(pass.IsRecordDropped());
    EXPECT_TRUE(pass.ProcessRecord(RecordOf({3, 1, 7.5, 300}), processed).IsWarning());
    EXPECT_FALSE(pass.GetUsable()[3]);
    EXPECT_EQ(0U, pass.GetNumRecords()) << "nothing was spooled";
}

TEST(DataPass, OnlyTheWeightDropsARecord)
{
    BINVarList list = FullList(IBINVariable::RoundTruncate);
    list.AddDiscreteUserMissing(1, 9.0, "");
    TestPreparator preparator(list);
    RecordTable source;
    for (const double weight : {0.0, -1.0, 0.9, gMissingValue, kNaN, 9.0, 2.7}) source.Add({0, weight, 1, 0});

    EXPECT_TRUE(preparator->PrepareData(&source).IsOK());

    EXPECT_EQ(std::vector<double>{2}, preparator.Values(1));
    EXPECT_EQ(1U, preparator->GetNumRecords());
}

TEST(DataPass, UserMissingAndNaNAreMissingInContinuousAttributes)
{
    BINVarList list = AVarList().WithAttribute("x");
    list.AddDiscreteUserMissing(0, 5.0, "");
    list.SetMissingInterval(0, 90.0, 99.0);
    TestPreparator preparator(list);
    RecordTable source{{5}, {90}, {99}, {kNaN}, {kInfinity}, {6}};

    EXPECT_TRUE(preparator->PrepareData(&source).IsOK());

    EXPECT_EQ((std::vector<double>{gMissingValue, gMissingValue, gMissingValue, gMissingValue, kInfinity, 6}),
              preparator.Values(0));
}

TEST(DataPass, WhatCountsAsACode)
{
    struct Case
    {
        double fCode;
        bool fIsTargetUsable;
        bool fIsCategoryUsable;
        double fStoredTarget;
    };
    for (const Case& c : {
             Case{255.9, true, true, 255.9}, Case{256, false, false, 0}, Case{-0.5, true, true, -0.5},
             Case{-1, true, true, gMissingValue},
             Case{-1.5, true, false, gMissingValue}, // the whole part of a target's code counts
             Case{-2, false, false, 0}, Case{kNaN, false, false, 0}, Case{kInfinity, false, false, 0},
             Case{4294967295.0, false, false, 0}, // would be -1 if it were cast to an int before the test
         })
    {
        SCOPED_TRACE(c.fCode);
        TestPreparator preparator(FullList());
        RecordTable source{{c.fCode, 1, 1, c.fCode}, {0, 1, 1, 0}};

        EXPECT_TRUE(preparator->PrepareData(&source).IsOK());

        EXPECT_EQ(c.fIsTargetUsable, preparator.IsUsable(0));
        EXPECT_EQ(c.fIsCategoryUsable, preparator.IsUsable(3));
        EXPECT_EQ(!c.fIsCategoryUsable, preparator->IsCutShort(3));
        if (c.fIsTargetUsable)
            EXPECT_EQ((std::vector<double>{c.fStoredTarget, 0}), preparator.Values(0));
        else
            EXPECT_EQ(std::vector<double>{}, preparator.Values(0)) << "cut short at the first record";
        EXPECT_EQ(2U, preparator.Values(2).size());
    }
}

TEST(DataPass, BadCodeInTheOnlyCategoricalVariableStopsIt)
{
    TestPreparator preparator(AVarList().WithAttribute("x").WithTarget("t", 2));
    RecordTable source{{1, 0}, {2, 300}, {3, 1}};

    const MCBinning::MCStatus status = preparator->PrepareData(&source);

    EXPECT_TRUE(status.IsError());
    EXPECT_EQ(MCBinning::BINStatusTooManyCategories, status.GetErrorCode());
    EXPECT_EQ(1, status.GetDiscreteDatum(0)) << "the target's index in the list";
    EXPECT_TRUE(preparator->GetStatus().IsOK());
    EXPECT_EQ(2, source.fNumNext);
}

TEST(DataPass, CodeBeyondTheDeclaredCategoriesExcludesTheVariableAtTheEnd)
{
    TestPreparator preparator(AVarList().WithTarget("t", 2).WithCategorical("c", 3));
    RecordTable source{{1, 3}, {0, 2}};

    EXPECT_TRUE(preparator->PrepareData(&source).IsOK());

    EXPECT_TRUE(preparator.IsUsable(0));
    EXPECT_FALSE(preparator.IsUsable(1));
    EXPECT_EQ((std::vector<double>{3, 2}), preparator.Values(1)) << "its file is complete";
    EXPECT_FALSE(preparator->IsCutShort(1));
}

TEST(DataPass, FlushesWheneverTheBufferIsFull)
{
    for (const int numRecords : {9999, 10000, 20001})
    {
        TestPreparator preparator(AVarList().WithAttribute("x"));
        RecordTable source;
        std::vector<double> expected;
        for (int i = 0; i < numRecords; ++i)
        {
            source.Add({static_cast<double>(i)});
            expected.push_back(i);
        }
        EXPECT_TRUE(preparator->PrepareData(&source).IsOK());
        EXPECT_EQ(expected, preparator.Values(0));
    }
}

TEST(DataPass, SourcesWithoutAnAcceptedRecord)
{
    for (RecordTable source : {RecordTable{}, RecordTable{{}, {}}, RecordTable{{0, 0, 1, 0}}})
    {
        TestPreparator preparator(FullList());
        EXPECT_EQ(kNoRecords, preparator->PrepareData(&source));
        EXPECT_EQ(kNoRecords, preparator->GetStatus());
    }
}

TEST(DataPass, MoreRecordsThanCanBeCountedAreNoMemory)
{
    constexpr unsigned int kMaxNumRecords = 2;
    for (const auto& [weights, code, numRead] : {std::tuple<std::vector<double>, int, int>{{1, 0, 2}, 0, 3},
                                                 {{1, 0, 2, 1, 1}, MCBinning::BINStatusOutOfMemory, 4}})
    {
        TestPreparator preparator(AVarList().WithWeight().WithAttribute("x"), nullptr, 0, nullptr, kMaxNumRecords);
        RecordTable source;
        for (const double weight : weights) source.Add({weight, 1}); // a weight of 0 counts nowhere

        const MCBinning::MCStatus status = preparator->PrepareData(&source);

        EXPECT_EQ(code, status.IsError() ? status.GetErrorCode() : 0);
        EXPECT_EQ(numRead, source.fNumNext);
        EXPECT_EQ(kMaxNumRecords, preparator->GetNumRecords());
    }
}

TEST(DataPass, ShortRecordsAreMissingBehindTheirEnd)
{
    TestPreparator preparator(AVarList().WithAttribute("a").WithAttribute("b"));
    RecordTable source{{1}, {2, 3, 4}};

    EXPECT_TRUE(preparator->PrepareData(&source).IsOK());

    EXPECT_EQ((std::vector<double>{gMissingValue, 3}), preparator.Values(1));
}

TEST(DataPass, ReportsEveryNthTurn)
{
    for (const auto& [interval, expected] :
         {std::pair<int, std::vector<int>>{0, {}}, {1, {1, 2, 2, 3}}, {2, {2, 3}}, {3, {2}}})
    {
        ReportLog log;
        TestPreparator preparator(AVarList().WithAttribute("x"), &log, interval);
        RecordTable source{{1}, {2}, {}, {3}}; // a turn without a record counts
        EXPECT_TRUE(preparator->PrepareData(&source).IsOK());
        EXPECT_EQ(expected, log.fIndices) << "interval " << interval;
    }
}

TEST(DataPass, CancelKeepsWhatWasReadButGivesNoData)
{
    CancelAfter query(3);
    TestPreparator preparator(AVarList().WithAttribute("x"), nullptr, 0, &query);
    RecordTable source{{1}, {2}, {3}};

    EXPECT_EQ(MCBinning::MCStatus(MCBinning::BINStatusCancelled, false), preparator->PrepareData(&source));
    EXPECT_EQ((std::vector<double>{1, 2}), preparator.Values(0));

    CancelAfter atOnce(1);
    TestPreparator other(AVarList().WithAttribute("x"), nullptr, 0, &atOnce);
    EXPECT_EQ(kNoRecords, other->PrepareData(&source));
}

TEST(DataPass, ListsWithAVariableThatHasNoPositionAreRefused)
{
    BINVarList list = AVarList().WithAttribute("x").WithAttribute("y");
    list.SetVariableRole(1, IBINVariable::RoleUndefined);
    TestPreparator preparator(list);
    RecordTable source{{1, 2}};

    EXPECT_EQ(MCBinning::MCStatus(MCBinning::BINStatusInvalidVarList, false), preparator->PrepareData(&source));
    EXPECT_EQ(0, source.fNumNext);
}
