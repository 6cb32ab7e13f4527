#include "tests/support/runs.h"
#include "tests/support/tempdir.h"

#include <gtest/gtest.h>

#include <thread>

// Objects of the library share nothing: each thread may have an algorithm of its own. ThreadSanitizer looks for the
// rest.

namespace
{

constexpr int kNumTurns = 10;

RecordTable Records()
{
    Dice dice(1);
    RecordTable records;
    for (int i = 0; i < 12000; ++i) // two flushes
    {
        const int code = dice.Below(3);
        records.Add({10.0 * code + 12.0 * dice.Fraction(), 1.0 * dice.Below(100), 1.0 * code, 0.5 + dice.Below(3)});
    }
    return records;
}

BINVarList List()
{
    return AVarList().WithAttribute("a").WithAttribute("b").WithTarget("t", 3).WithWeight(kUnrounded);
}

std::vector<BINAttributeTargetResults> RunSupervised(const std::string& directory)
{
    BINSettings settings = SupervisedSettings();
    settings.SetTempDirName(directory);
    Supervised run(List(), settings);
    RecordTable records = Records();
    EXPECT_FALSE(run.Run(records).IsError());
    return run.All();
}

std::vector<BINAttributeResults> RunEqualFrequency(const std::string& directory)
{
    EFBINSettings settings = EqualFrequencySettings(7);
    settings.SetTempDirName(directory);
    EqualFrequency run(List(), settings);
    RecordTable records = Records();
    EXPECT_FALSE(run.Run(records).IsError());
    return run.All();
}

/// Runs in a thread of its own, `kNumTurns` times one after the other.
template<class Run, class Results>
std::thread StartThread(const Run& run, const std::string& directory, std::vector<std::vector<Results>>& results)
{
    return std::thread(
        [&run, &directory, &results]
        {
            for (int turn = 0; turn < kNumTurns; ++turn) results.push_back(run(directory));
        });
}

template<class Results>
void ExpectEachIs(const std::vector<Results>& expected, const std::vector<std::vector<Results>>& turns)
{
    EXPECT_EQ(static_cast<std::size_t>(kNumTurns), turns.size());
    for (const std::vector<Results>& actual : turns)
    {
        ASSERT_EQ(expected.size(), actual.size());
        for (std::size_t i = 0; i < expected.size(); ++i) ExpectSame(expected[i], actual[i]);
    }
}

} // namespace

TEST(TwoThreads, EachWithAnAlgorithmOfItsOwnGetTheResultsOfOne)
{
    const TempDir dir;
    std::vector<std::vector<BINAttributeTargetResults>> supervised;
    std::vector<std::vector<BINAttributeTargetResults>> alike;
    std::vector<std::vector<BINAttributeResults>> equalFrequency;

    std::thread first = StartThread(RunSupervised, dir.Path(), supervised);
    std::thread second = StartThread(RunEqualFrequency, dir.Path(), equalFrequency);
    first.join();
    second.join();
    first = StartThread(RunSupervised, dir.Path(), supervised);
    second = StartThread(RunSupervised, dir.Path(), alike);
    first.join();
    second.join();

    EXPECT_TRUE(dir.IsEmpty());
    ASSERT_EQ(2U * kNumTurns, supervised.size());
    supervised.resize(kNumTurns);
    ExpectEachIs(RunSupervised(dir.Path()), supervised);
    ExpectEachIs(RunSupervised(dir.Path()), alike);
    ExpectEachIs(RunEqualFrequency(dir.Path()), equalFrequency);
}
