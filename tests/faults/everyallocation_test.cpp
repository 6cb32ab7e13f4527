#include "tests/faults/tworuns.h"
#include "tests/support/tempdir.h"

#include <cstdlib>
#include <new>
#include <optional>
#include <string>

namespace
{

int numAllocations = 0;
std::size_t numBytes = 0;
int failingAllocation = 0;     ///< its number, counted from 1; 0 for none
bool isFromThenOn = false;     ///< all behind it fail, too
bool throwsOwnFailure = false; ///< the failing one throws what no standard library knows

struct OwnFailure
{
};

bool Fails()
{
    ++numAllocations;
    return numAllocations == failingAllocation ||
           (isFromThenOn && failingAllocation > 0 && numAllocations > failingAllocation);
}

} // namespace

// Not inlined: g++ would see through one of a pair and complain that it doesn't match the other.
[[gnu::noinline]] void* operator new(std::size_t size)
{
    numBytes += size;
    void* memory = Fails() ? nullptr : std::malloc(size > 0 ? size : 1);
    if (memory == nullptr && throwsOwnFailure)
        throw OwnFailure();
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}

[[gnu::noinline]] void operator delete(void* memory) noexcept
{
    std::free(memory);
}

[[gnu::noinline]] void operator delete(void* memory, std::size_t) noexcept
{
    std::free(memory);
}

namespace
{

template<class Step, class OtherStep>
auto OrElse(const Step& step, const OtherStep& otherStep)
{
    try
    {
        return step();
    }
    catch (const std::bad_alloc&)
    {
        return otherStep();
    }
}

/// Repeats a step whose allocation failed: nothing half done may be in the way.
template<class Step>
auto Again(const Step& step)
{
    return OrElse(step, step);
}

const std::vector<std::string> kKinds{"first of the kinds", "second of the kinds", "third of the kinds"};
const std::vector<double> kGroups{2.0, 4.0};

/// The variables of SomeRecords(), with user-missing values that these don't have.
void FillList(BINVarList& list)
{
    constexpr auto kAttribute = IBINVariable::RoleAttribute;
    constexpr auto kTarget = IBINVariable::RoleTarget;
    EXPECT_EQ(0, Again([&] { return list.AddContVar("size", "in whole metres, rounded", kAttribute); }));
    EXPECT_EQ(1, Again([&] { return list.AddContVar("price", "", kAttribute); }));
    EXPECT_EQ(2, Again([&] { return list.AddCatVar("kind", "", kKinds, kKinds, kTarget); }));
    EXPECT_EQ(3, Again([&] { return list.AddCatVar("group", "", kGroups, kAttribute); }));
    EXPECT_EQ(4, Again([&] { return list.AddWeightVar("weight", "", kUnrounded); }));
    EXPECT_TRUE(Again([&] { return list.AddDiscreteUserMissing(0, 99.0, "not measured at all"); }));
    EXPECT_TRUE(Again([&] { return list.AddDiscreteUserMissing(2, "none of the kinds", "none of the kinds"); }));
    EXPECT_TRUE(Again([&] { return list.SetMissingInterval(1, 90.0, 99.0); }));
}

std::unique_ptr<IBINAlgorithm> Create(BINFactory& factory, BINSettings& settings, BINVarList& list)
{
    return std::unique_ptr<IBINAlgorithm>(factory.CreateBINAlgorithm(settings, list));
}

std::unique_ptr<IEFBINAlgorithm> Create(EFBINFactory& factory, EFBINSettings& settings, BINVarList& list)
{
    return std::unique_ptr<IEFBINAlgorithm>(factory.CreateEFBINAlgorithm(settings, list));
}

/// All that a host does with the library.
template<class Host, class Factory, class Settings>
auto UseAll(const Settings& settings, RecordTable& records)
{
    BINVarList list;
    FillList(list);
    BINVarList copiedList = Again([&] { return BINVarList(list); });
    Settings copiedSettings = Again([&] { return Settings(settings); });
    Factory factory;
    auto algorithm = Again([&] { return Create(factory, copiedSettings, copiedList); });
    if (factory.GetStatus().GetErrorCode() == MCBinning::BINStatusOutOfMemory)
        algorithm = Create(factory, copiedSettings, copiedList);
    if (algorithm == nullptr)
        throw std::bad_alloc(); // the host gives up
    Host host(std::move(algorithm));

    const auto outOfMemory = [] { return MCBinning::MCStatus(MCBinning::BINStatusOutOfMemory, false); };
    const MCBinning::MCStatus first = OrElse([&] { return host.Run(records); }, outOfMemory);
    MCBinning::MCStatus second = OrElse([&] { return RunSecond(host, records); }, outOfMemory);
    if (first.IsError() && second.GetErrorCode() == MCBinning::BINStatusNoRecords)
        second = first; // a reading of the source that was broken off leaves no data
    auto results = Again([&] { return host.All(); });
    const auto copiedOutput = Again([&] { return *host->GetOutput(); });
    Again([&] { return copiedOutput.GetAllCutPoints(results); });
    return Outcome<typename decltype(results)::value_type>{first, second, std::move(results)};
}

/// Lets the first allocation fail, then the second, until the host is done before the failing one. With `fromThenOn`
/// all later ones fail, too: the host gives up at what it can't do a second time, and its objects are deleted while
/// there still is no memory.
template<class Host, class Factory, class Settings>
void FailEachAllocation(Settings settings, bool fromThenOn)
{
    const TempDir dir;
    settings.SetTempDirName(dir.Path());
    RecordTable records = SomeRecords(50);
    const auto undisturbed = UseAll<Host, Factory>(settings, records);
    ASSERT_TRUE(undisturbed.fSecond.IsOK());

    int n = 0;
    for (bool hasFired = true; hasFired && !::testing::Test::HasFailure();)
    {
        SCOPED_TRACE("allocation " + std::to_string(++n) + (fromThenOn ? " and all behind it" : ""));
        records = SomeRecords(50);
        std::optional<decltype(UseAll<Host, Factory>(settings, records))> disturbed;
        failingAllocation = numAllocations + n;
        isFromThenOn = fromThenOn;
        OrElse([&] { disturbed = UseAll<Host, Factory>(settings, records); }, [] {});
        hasFired = numAllocations >= failingAllocation;
        failingAllocation = 0;
        isFromThenOn = false;

        EXPECT_TRUE(disturbed.has_value() || (hasFired && fromThenOn)) << "a host that tries again is served";
        if (disturbed.has_value())
            ExpectSound(undisturbed, *disturbed, MCBinning::BINStatusOutOfMemory);
        EXPECT_TRUE(dir.IsEmpty());
    }
    EXPECT_GT(n, 300) << "valgrind takes this operator new only with --soname-synonyms=somalloc=nouserintercepts";
}

} // namespace

TEST(EveryAllocation, MayFailForAHostOfSupervisedRuns)
{
    FailEachAllocation<Supervised, BINFactory>(PreBinningSettings(), false);
}

TEST(EveryAllocation, MayFailForAHostOfEqualFrequencyRuns)
{
    FailEachAllocation<EqualFrequency, EFBINFactory>(EqualFrequencySettings(6), false);
}

TEST(EveryAllocation, MayFailWithAllBehindIt)
{
    FailEachAllocation<Supervised, BINFactory>(PreBinningSettings(), true);
    FailEachAllocation<EqualFrequency, EFBINFactory>(EqualFrequencySettings(6), true);
}

TEST(EveryAllocation, OfTheBufferOrTheTuplesMayFailWithAnyException)
{
    throwsOwnFailure = true;
    int numPassed = 0;
    int numSecondTries = 0;
    int numTold = 0;
    for (int n = 1;; ++n)
    {
        const TempDir dir;
        EFBINSettings settings = EqualFrequencySettings(4);
        settings.SetTempDirName(dir.Path());
        EqualFrequency host(AVarList().WithAttribute("x"), settings);
        RecordTable records{{1}, {2}, {3}, {4}, {5}, {6}, {7}, {8}};
        failingAllocation = numAllocations + n;
        try
        {
            const MCBinning::MCStatus status = host.Run(records);
            const bool hasFired = numAllocations >= failingAllocation;
            failingAllocation = 0;
            if (!hasFired)
                break;
            EXPECT_TRUE(status.IsOK() || status.GetErrorCode() == MCBinning::BINStatusOutOfMemory);
            ++(status.IsOK() ? numSecondTries : numTold);
        }
        catch (const OwnFailure&)
        {
            failingAllocation = 0;
            ++numPassed;
        }
    }
    throwsOwnFailure = false;

    EXPECT_GT(numPassed, 10);
    EXPECT_EQ(2, numSecondTries) << "a buffer of half the size replaces the first one";
    EXPECT_EQ(2, numTold) << "the vector of tuples, and the tuples in it";
}

TEST(Allocations, OfWideListsAndTheirResultsGrowWithTheNumberOfVariablesOnly)
{
    constexpr int kNumVariables = 2000;
    constexpr std::size_t kBytesForEach = 2000;
    const std::string longName(40, 'n'); // a copy of it needs an allocation
    BINOutput output;

    const std::size_t beforeList = numBytes;
    BINVarList list;
    for (int i = 0; i < kNumVariables; ++i)
        ASSERT_EQ(i, list.AddContVar(longName + std::to_string(i), "", IBINVariable::RoleAttribute));
    const std::size_t ofList = numBytes - beforeList;
    for (int i = 1; i < kNumVariables; ++i)
        output.SetAttributeTargetResults(MCBinning::MCStatus(), {}, {}, i, 0, 0, 0.0, 0.0, 0.0, 0.0, 0.0);
    const std::size_t beforeResults = numBytes;
    std::vector<BINAttributeTargetResults> results;
    for (int i = 1; i < kNumVariables; ++i) ASSERT_TRUE(output.GetAttributeCutPoints(i, results).IsOK());
    const std::size_t ofResults = numBytes - beforeResults;

    EXPECT_LT(ofList, kNumVariables * kBytesForEach);
    EXPECT_LT(ofResults, kNumVariables * kBytesForEach);
}
