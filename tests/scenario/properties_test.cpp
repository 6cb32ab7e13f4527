// What must not change a result: the order of the records, the order of the variables in a call, a weight in place of
// repeated records, and what the object did before. Results are compared to the last bit, so the weights here are whole
// numbers or halves.

#include "tests/support/runs.h"

#include <gtest/gtest.h>

using MCMV::gMissingValue;

namespace
{

constexpr int kNumAttributes = 3;

/// Fields of a record: three attributes, a target of three categories, a weight.
BINVarList List(IBINVariable::BINWRoundingOption option = kUnrounded)
{
    return AVarList().WithAttribute("a").WithAttribute("b").WithAttribute("c").WithTarget("t", 3).WithWeight(option);
}

/// One attribute tells much of the target, one little, and one is noise of few values; some data are missing.
RecordTable RandomRecords(unsigned int seed, double weightStep)
{
    Dice dice(seed);
    RecordTable records;
    const int numRecords = 50 + dice.Below(300);
    for (int i = 0; i < numRecords; ++i)
    {
        const int code = dice.Below(3);
        const double a = dice.Below(15) == 0 ? gMissingValue : 10.0 * code + 12 * dice.Fraction();
        const double b = dice.Below(100) + 20 * (code == 2 ? 1 : 0);
        const double weight = weightStep * (1 + dice.Below(4));
        records.Add({a, b, static_cast<double>(dice.Below(4)), dice.Below(20) == 0 ? -1.0 : code, weight});
    }
    return records;
}

BINSettings Settings(unsigned int seed)
{
    BINSettings settings = SupervisedSettings();
    settings.SetRightBorderClosed(seed % 2 == 0);
    settings.SetNumDistinctValueThreshold(seed % 3 == 0 ? 20 : 0);
    settings.SetSmallBinDetectionThreshold(seed % 5 == 0 ? 0.4 : 0.0);
    return settings;
}

std::vector<BINAttributeTargetResults> Bin(RecordTable records, unsigned int seed,
                                           const std::vector<int>& attributes = {0, 1, 2})
{
    Supervised run(List(), Settings(seed));
    run.Run(records, attributes);
    std::vector<BINAttributeTargetResults> results;
    for (int attribute = 0; attribute < kNumAttributes; ++attribute) results.push_back(run.Pair(attribute, 3));
    return results;
}

std::vector<BINAttributeResults> CutEqually(RecordTable records, unsigned int seed)
{
    EFBINSettings settings = EqualFrequencySettings(2 + static_cast<int>(seed % 9));
    settings.SetRightBorderClosed(seed % 2 == 0);
    EqualFrequency run(List(), settings);
    run.Run(records);
    return run.All();
}

template<class Results>
void ExpectAllSame(const std::vector<Results>& expected, const std::vector<Results>& actual)
{
    ASSERT_EQ(expected.size(), actual.size());
    for (std::size_t i = 0; i < expected.size(); ++i) ExpectSame(expected[i], actual[i]);
}

} // namespace

class Properties : public testing::TestWithParam<unsigned int>
{
};

INSTANTIATE_TEST_SUITE_P(Seeds, Properties, testing::Range(1U, 61U));

TEST_P(Properties, OrderOfRecordsChangesNothing)
{
    RecordTable records = RandomRecords(GetParam(), 0.5);
    RecordTable shuffled = records;
    Dice(GetParam() + 1000).Shuffle(shuffled.fRows);

    ExpectAllSame(Bin(records, GetParam()), Bin(shuffled, GetParam()));
    ExpectAllSame(CutEqually(records, GetParam()), CutEqually(shuffled, GetParam()));
}

TEST_P(Properties, WeightStandsForRepeatedRecords)
{
    const RecordTable weighted = RandomRecords(GetParam(), 1.0);
    RecordTable repeated;
    for (std::vector<double> row : weighted.fRows)
    {
        const int weight = static_cast<int>(row[4]);
        row[4] = 1.0;
        for (int i = 0; i < weight; ++i) repeated.Add(row);
    }

    ExpectAllSame(Bin(weighted, GetParam()), Bin(repeated, GetParam()));
    ExpectAllSame(CutEqually(weighted, GetParam()), CutEqually(repeated, GetParam()));
}

TEST_P(Properties, NeitherOtherVariablesNorEarlierRunsMatter)
{
    RecordTable records = RandomRecords(GetParam(), 0.5);
    const std::vector<BINAttributeTargetResults> expected = Bin(records, GetParam());

    ExpectAllSame(expected, Bin(records, GetParam(), {2, 0, 1}));
    Supervised run(List(), Settings(GetParam()));
    run.Run(records, {1});
    run.Run(records, {0, 2, 1});
    const std::vector<BINAttributeTargetResults> all = run.All();
    ASSERT_EQ(4U, all.size());
    ExpectAllSame(expected, {all[1], all[3], all[2]});
    ExpectSame(expected[1], all[0]);
}

TEST_P(Properties, TablesAddUpAndCutPointsRise)
{
    const std::vector<BINAttributeTargetResults> results = Bin(RandomRecords(GetParam(), 0.5), GetParam());

    EXPECT_FALSE(results[0].GetCutPoints().empty()) << "the first attribute is informative";
    for (const BINAttributeTargetResults& result : results)
    {
        const std::vector<double>& cuts = result.GetCutPoints();
        EXPECT_TRUE(std::is_sorted(cuts.begin(), cuts.end()));
        ASSERT_EQ(cuts.size() + 1, result.GetCellCounts().size());
        double total = 0.0;
        for (const std::vector<double>& row : result.GetCellCounts())
        {
            EXPECT_EQ(row[0], row[1] + row[2] + row[3]);
            total += row[0];
        }
        EXPECT_EQ(result.GetTotalWeight(), total);
    }
}
