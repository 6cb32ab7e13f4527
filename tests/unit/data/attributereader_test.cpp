#include "data/binattributereader.h"
#include "data/tally.h"
#include "tests/support/testpreparator.h"

#include <gtest/gtest.h>

#include <fstream>
#include <tuple>

using MCMV::gMissingValue;

namespace
{

/// A reader over the records, ready for reads.
class LoadedReader
{
public:
    LoadedReader(const BINVarList& list, RecordTable records, TupleKind kind = TupleKind::kWithTarget)
        : fRecords(std::move(records)), fPreparator(list), fReader(&fRecords, &*fPreparator, kind)
    {
        EXPECT_TRUE(fReader.ReadRecords().IsOK());
    }

    std::vector<BINSortTuple>& Pair(int attribute, int target)
    {
        std::vector<BINSortTuple>* tuples = nullptr;
        EXPECT_TRUE(fReader.GetAttributeTargetData(attribute, target, &tuples).IsOK());
        return *tuples;
    }

    BINAttributeReader* operator->() { return &fReader; }

    /// Somebody else writes behind the last record in each of the files.
    void AppendToFiles(const std::vector<double>& values) const
    {
        for (const std::string& name : fPreparator.fDirectory.FileNames())
        {
            std::ofstream file(fPreparator.fDirectory.File(name), std::ios::binary | std::ios::app);
            for (const double value : values) file.write(reinterpret_cast<const char*>(&value), sizeof(value));
        }
    }

private:
    RecordTable fRecords;
    TestPreparator fPreparator;
    BINAttributeReader fReader; // goes before the preparator, which removes the files that it has open
};

/// Fields of a record: attribute, target, weight, attribute.
BINVarList FullList()
{
    return AVarList().WithAttribute("x").WithTarget("t", 6).WithWeight().WithAttribute("y");
}

} // namespace

TEST(AttributeReader, JoinsSortsAndLeavesOutWhatIsMissing)
{
    LoadedReader reader(FullList(),
                        {{3, 0, 2, 1}, {1, 5, 1, 1}, {gMissingValue, 0, 4, 1}, {2, -1, 8, 1}, {1, 0, 16, 1}});

    const std::vector<BINSortTuple>& tuples = reader.Pair(0, 1);

    ASSERT_EQ(3U, reader->GetNumTuples());
    EXPECT_EQ((std::vector<double>{1, 1, 3}),
              (std::vector<double>{tuples[0].fValue, tuples[1].fValue, tuples[2].fValue}));
    EXPECT_EQ(2U, reader->GetNumDistinct());
    EXPECT_EQ(6U, reader->GetNumTargetCats()) << "largest code + 1, whether or not those between occur";
    EXPECT_EQ(19.0, reader->GetTotalWeight());
    EXPECT_EQ(31.0, reader->GetTotalWeightWithMissing());
    EXPECT_EQ(1.0, reader->GetMinValue());
    EXPECT_EQ(3.0, reader->GetMaxValue());
}

TEST(AttributeReader, OrderOfRecordsMakesNoDifferenceToASumThatRounds)
{
    // Each small weight is lost if it comes after the large one, and counts if it comes before.
    const std::vector<std::vector<double>> cases{
        {0x1p53, 1, 1, 1}, {1, 0x1p-53, 0x1p-53, 0x1p-53}, {0x1p13, 0x1p-40, 0x1p-40, 0x1p-40}, {1e300, 1e284, 1e284}};
    for (const std::vector<double>& weights : cases)
    {
        SCOPED_TRACE(testing::PrintToString(weights));
        RecordTable records;
        for (const double weight : weights) records.Add({7, 0, weight, 1});
        RecordTable reversed = records;
        std::reverse(reversed.fRows.begin(), reversed.fRows.end());
        const BINVarList list =
            AVarList().WithAttribute("x").WithTarget("t", 6).WithWeight(kUnrounded).WithAttribute("y");

        const std::vector<double> borders{-100, 100};
        std::vector<double> table;
        std::vector<double> reversedTable;
        LoadedReader reader(list, records);
        reader.Pair(0, 1);
        EXPECT_TRUE(reader->TallyBins(&borders, true, table).IsOK());
        LoadedReader reversedReader(list, reversed);
        reversedReader.Pair(0, 1);
        EXPECT_TRUE(reversedReader->TallyBins(&borders, true, reversedTable).IsOK());

        EXPECT_EQ(table, reversedTable);
    }
}

TEST(AttributeReader, AttributeWithoutAValueHasNoFigures)
{
    LoadedReader reader(FullList(), {{gMissingValue, 0, 2, 1}, {gMissingValue, 1, 1, 2}});
    reader.Pair(3, 1);
    EXPECT_EQ(2U, reader->GetNumDistinct());

    reader.Pair(0, 1);

    EXPECT_EQ(0U, reader->GetNumTuples());
    EXPECT_EQ(0U, reader->GetNumDistinct());
    EXPECT_EQ(0.0, reader->GetTotalWeight());
    EXPECT_EQ(3.0, reader->GetTotalWeightWithMissing());
    EXPECT_EQ(gMissingValue, reader->GetMinValue());
    EXPECT_EQ(gMissingValue, reader->GetMaxValue());
}

// A sum of tenths depends on their order, and tables are summed in the order of the tuples.
TEST(AttributeReader, TuplesOfOneValueStandInAnOrderThatIsNotThatOfTheRecords)
{
    RecordTable records;
    Dice dice(1);
    for (int i = 0; i < 300; ++i)
        records.Add({1.0 * dice.Below(4), 1.0 * dice.Below(3), 0.1 * (1 + dice.Below(9)), 0.0});
    RecordTable shuffled = records;
    dice.Shuffle(shuffled.fRows);
    const BINVarList list = AVarList().WithAttribute("x").WithTarget("t", 3).WithWeight(kUnrounded).WithAttribute("y");
    const auto tuplesOf = [&](const RecordTable& table)
    {
        LoadedReader reader(list, table);
        std::vector<std::tuple<double, int, double>> tuples;
        for (const BINSortTuple& tuple : reader.Pair(0, 1))
            tuples.emplace_back(tuple.fValue, tuple.fTargetCode, tuple.fWeight);
        return tuples;
    };

    EXPECT_EQ(tuplesOf(records), tuplesOf(shuffled));
}

TEST(AttributeReader, NothingIsReadBehindTheRecordsOfThePass)
{
    const RecordTable records{{1, 0, 1, 1}, {2, 1, 1, 1}, {3, 0, 1, 2}};
    for (const TupleKind kind : {TupleKind::kWithTarget, TupleKind::kWithoutTarget})
    {
        LoadedReader reader(FullList(), records, kind);

        reader.AppendToFiles({1, 1, 1, 1});

        std::vector<BINValueTuple>* values = nullptr;
        if (kind == TupleKind::kWithTarget)
            EXPECT_EQ(records.fRows.size(), reader.Pair(0, 1).size());
        else
            EXPECT_TRUE(reader->GetAttributeData(0, &values).IsOK());
        EXPECT_EQ(records.fRows.size(), reader->GetNumTuples());
        EXPECT_EQ(3.0, reader->GetTotalWeight());
    }
}

TEST(AttributeReader, PreBinningIsEngagedAboveTheThresholdOnly)
{
    LoadedReader reader(FullList(), {{1, 0, 1, 1}, {2, 1, 1, 1}, {3, 0, 1, 2}});
    for (const auto& [threshold, isEngaged] : {std::pair<unsigned int, bool>{0, false}, {3, false}, {2, true}})
    {
        reader->SetNumDistinctValueThreshold(threshold);
        reader.Pair(0, 1);
        EXPECT_EQ(isEngaged, reader->IsPreBinningEngaged()) << threshold;
    }
    reader.Pair(3, 1);
    EXPECT_FALSE(reader->IsPreBinningEngaged()) << "found out afresh for each attribute";
}

TEST(AttributeReader, TargetsCanChangeFromReadToRead)
{
    LoadedReader reader(AVarList().WithAttribute("x").WithCategorical("c", 3).WithCategorical("d", 4),
                        {{1, 2, 0}, {2, 0, 3}, {3, -1, 1}}, TupleKind::kWithTarget);

    for (int turn = 0; turn < 2; ++turn)
    {
        EXPECT_EQ(2, reader.Pair(0, 1)[0].fTargetCode);
        EXPECT_EQ(2U, reader->GetNumTuples());
        EXPECT_EQ(0, reader.Pair(0, 2)[0].fTargetCode);
        EXPECT_EQ(3U, reader->GetNumTuples());
        EXPECT_EQ(3, reader.Pair(1, 2)[0].fTargetCode) << "the list's variables are attributes too";
    }
}

TEST(AttributeReader, UnusableTargetKeepsTheFiguresOfTheLastRead)
{
    LoadedReader reader(AVarList().WithAttribute("x").WithTarget("t", 2).WithCategorical("c", 2),
                        {{1, 0, 7}, {2, 1, 0}});
    reader.Pair(0, 1);

    for (const int target : {-1, 2, 99})
    {
        std::vector<BINSortTuple> other;
        std::vector<BINSortTuple>* tuples = &other;
        EXPECT_EQ(MCBinning::BINStatusTargetUnusable,
                  reader->GetAttributeTargetData(0, target, &tuples).GetErrorCode());
        EXPECT_EQ(nullptr, tuples);
        EXPECT_EQ(2U, reader->GetNumTuples());
    }
}

TEST(AttributeReader, AttributeCutShortIsAnErrorThatNamesIt)
{
    LoadedReader reader(AVarList().WithAttribute("x").WithTarget("t", 2).WithCategorical("c", 2),
                        {{1, 0, 300}, {2, 1, 0}});
    std::vector<BINSortTuple>* tuples = nullptr;

    const MCBinning::MCStatus status = reader->GetAttributeTargetData(2, 1, &tuples);

    EXPECT_TRUE(status.IsError());
    EXPECT_EQ(MCBinning::BINStatusTooManyCategories, status.GetErrorCode());
    EXPECT_EQ(2, status.GetDiscreteDatum(0));
    EXPECT_EQ(nullptr, tuples);
}

namespace
{

const std::vector<BINSortTuple> kTuples{{1, 0, 1.0}, {2, 1, 1.0}, {2, 0, 1.0}, {4, 1, 0.5}, {9, 9, 9.0}};
constexpr unsigned int kNumTuples = 4; // the last one is another attribute's

} // namespace

TEST(Tally, PutsValuesOnTheClosedSideOfABorder)
{
    const std::vector<double> borders{-100, 1, 2, 3, 5};
    std::vector<double> table;

    EXPECT_TRUE(TallyBins(kTuples, kNumTuples, 2, borders, true, table).IsOK());
    EXPECT_EQ((std::vector<double>{1, 0, 1, 1, 0, 0, 0, 0.5}), table);
    EXPECT_TRUE(TallyBins(kTuples, kNumTuples, 2, borders, false, table).IsOK());
    EXPECT_EQ((std::vector<double>{0, 0, 1, 0, 1, 1, 0, 0.5}), table);
}

TEST(Tally, MakesARowOfEachDistinctValue)
{
    std::vector<double> values;
    std::vector<double> table;

    TallyDistinct(kTuples, kNumTuples, 3, 2, values, table);

    EXPECT_EQ((std::vector<double>{1, 2, 4}), values);
    EXPECT_EQ((std::vector<double>{1, 0, 1, 1, 0, 0.5}), table);
}

TEST(Tally, BordersThatDontFitTheTuplesAreAWarning)
{
    const MCBinning::MCStatus badTable(MCBinning::BINStatusBadBinTable, true);
    std::vector<double> table;
    for (const std::vector<double>& borders : {std::vector<double>{}, {-100, 2}, {-100, 2, 4, 5}})
    {
        SCOPED_TRACE(testing::PrintToString(borders));
        EXPECT_EQ(badTable, TallyBins(kTuples, kNumTuples, 2, borders, true, table));
    }
    LoadedReader reader(AVarList().WithAttribute("x").WithTarget("t", 2), {{1, 0}, {2, 1}});
    reader.Pair(0, 1);
    EXPECT_EQ(badTable, reader->TallyBins(nullptr, true, table));
}
