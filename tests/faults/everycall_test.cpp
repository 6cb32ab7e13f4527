#include "binning/binalgorithm.h"
#include "binning/efbinalgorithm.h"
#include "faults/tworuns.h"
#include "support/faultyplatform.h"
#include "support/tempdir.h"

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
