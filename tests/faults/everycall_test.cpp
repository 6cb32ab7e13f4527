#include "binning/binalgorithm.h"
#include "binning/efbinalgorithm.h"
#include "tests/faults/tworuns.h"
#include "tests/support/faultyplatform.h"
#include "tests/support/tempdir.h"

namespace
{

template<class Host, class Algorithm, class Settings>
auto RunTwice(const Settings& settings, Platform& platform, RecordTable records)
{
    AVarList list;
    list.WithAttribute("size").WithAttribute("price").WithTarget("kind", 3).WithCategorical("group", 2);
    Host host(std::make_unique<Algorithm>(settings, list.WithWeight(kUnrounded), &platform));
    const MCBinning::MCStatus first = host.Run(records);
    const MCBinning::MCStatus second = RunSecond(host, records);
    return Outcome<typename decltype(host.All())::value_type>{first, second, host.All()};
}

/// Lets the first call fail, then the second, until a run ends before the call is reached.
template<class Host, class Algorithm, class Settings>
void FailEachCall(Settings settings, const RecordTable& records, bool fromThenOn)
{
    const TempDir dir;
    settings.SetTempDirName(dir.Path());
    const auto undisturbed = RunTwice<Host, Algorithm>(settings, *SystemPlatform(), records);
    ASSERT_TRUE(undisturbed.fSecond.IsOK());
    int call = 0;
    for (bool hasFired = true; hasFired && !::testing::Test::HasFailure();)
    {
        SCOPED_TRACE("file call " + std::to_string(++call) + (fromThenOn ? " and all behind it" : ""));
        FaultyPlatform platform;
        platform.fFailingCall = call;
        platform.fFromThenOn = fromThenOn;

        const auto disturbed = RunTwice<Host, Algorithm>(settings, platform, records);

        hasFired = platform.fHasFired;
        ExpectSound(undisturbed, disturbed, MCBinning::BINStatusCannotOpenTempFile);
        EXPECT_EQ(platform.fNumOpened, platform.fNumClosed);
        EXPECT_TRUE(dir.IsEmpty());
    }
    EXPECT_GT(call, 50) << "some calls don't go through the platform";
}

template<class Host, class Algorithm, class Settings>
void FailEachCall(const Settings& settings)
{
    // Two flushes, the first of 10000 records; one of 25 counts nowhere.
    FailEachCall<Host, Algorithm>(settings, SomeRecords(10500), false);
    // A pass ends at the first call that fails, so failures that go on differ behind it alone.
    FailEachCall<Host, Algorithm>(settings, SomeRecords(50), true);
}

} // namespace

TEST(EveryFileCall, MayFailInSupervisedRuns)
{
    FailEachCall<Supervised, BINAlgorithm>(PreBinningSettings());
}

TEST(EveryFileCall, MayFailInEqualFrequencyRuns)
{
    FailEachCall<EqualFrequency, EFBINAlgorithm>(EqualFrequencySettings(6));
}

// The results show as well that something was lost, but a host has to know before it reads a million records more.
TEST(FullDisk, EndsTheReadingOfTheSourceWithTheFlushThatMeetsIt)
{
    constexpr int kRowsPerFlush = 10000;
    constexpr int kNumRows = kRowsPerFlush + 500;
    constexpr int kNumFiles = 2;
    for (int write = 1; write <= 2 * kNumFiles; ++write)
    {
        for (const bool isToldAtClose : {false, true})
        {
            SCOPED_TRACE("write " + std::to_string(write) + (isToldAtClose ? " told at the close" : ""));
            const TempDir dir;
            BINSettings settings = SupervisedSettings();
            settings.SetTempDirName(dir.Path());
            FaultyPlatform platform;
            platform.fFullAtWrite = write;
            platform.fIsToldAtClose = isToldAtClose;
            RecordTable records;
            for (int i = 0; i < kNumRows; ++i) records.Add({1.0 * (i % 100), i % 100 < 50 ? 0.0 : 1.0});
            const BINVarList list = AVarList().WithAttribute("age").WithTarget("bought", 2);
            Supervised host(std::make_unique<BINAlgorithm>(settings, list, &platform));

            EXPECT_EQ(MCBinning::BINStatusCannotOpenTempFile, host.Run(records).GetErrorCode());

            EXPECT_EQ(write <= kNumFiles ? kRowsPerFlush : kNumRows, records.fNumNext);
            EXPECT_TRUE(host.All().empty());
        }
    }
}
