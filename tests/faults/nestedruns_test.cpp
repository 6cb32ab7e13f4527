#include "tests/support/runs.h"

#include <functional>
#include <string>

// A host that runs the object again from inside its own objects, while a call of Run is under way.

using namespace std::string_literals;

namespace
{

using Attributes = std::vector<int>;
using InnerRun = std::function<void()>;

/// Where the inner call comes from. Each of these calls the host in its own way.
enum class Caller
{
    kFirstHasNext, ///< no data: the inner call reads the records
    kHasNext,      ///< the records are being read
    kNext,
    kQueryAtFirst, ///< no data
    kQueryInPass,
    kQueryAtAttribute,
    kListenerInPass,
    kListenerAtAttribute
};

const std::pair<Caller, const char*> kCallers[] = {{Caller::kFirstHasNext, "the first HasNext"},
                                                   {Caller::kHasNext, "HasNext"},
                                                   {Caller::kNext, "Next"},
                                                   {Caller::kQueryAtFirst, "the first query"},
                                                   {Caller::kQueryInPass, "the query of a record"},
                                                   {Caller::kQueryAtAttribute, "the query of an attribute"},
                                                   {Caller::kListenerInPass, "the report of a record"},
                                                   {Caller::kListenerAtAttribute, "the report of an attribute"}};

/// One object in all roles of a host. At the call that `fCaller` stands for it runs `fInnerRun`, once.
class NestingHost : public RecordTable, public ProgressListener, public MCQueryCancel
{
public:
    explicit NestingHost(Caller caller) : fCaller(caller)
    {
        for (int i = 0; i < 40; ++i)
            Add({i % 20 * 1.0, i % 7 * 1.0, i % 20 < 10 ? 0.0 : 1.0, i % 2 * 1.0, i % 5 * 1.0, 1.0 + i % 3});
        fBeforeNext = [this](std::size_t) { CallFrom(Caller::kNext); };
    }

    bool HasNext() override
    {
        CallFrom(fNumHasNext == 0 ? Caller::kFirstHasNext : Caller::kHasNext);
        return RecordTable::HasNext();
    }

    bool QueryCancel() override
    {
        // The first query behind the last record still belongs to the pass.
        fNumQueriesBehindRecords += AreRecordsRead() ? 1 : 0;
        const Caller later = fNumQueriesBehindRecords > 1 ? Caller::kQueryAtAttribute : Caller::kQueryInPass;
        CallFrom(fNumHasNext == 0 ? Caller::kQueryAtFirst : later);
        return false;
    }

    void ReportProgress(ProgressReport&) override
    {
        CallFrom(AreRecordsRead() ? Caller::kListenerAtAttribute : Caller::kListenerInPass);
    }

    InnerRun fInnerRun; ///< null when it has been called

private:
    bool AreRecordsRead() const { return fNumNext == static_cast<int>(fRows.size()); }

    void CallFrom(Caller caller)
    {
        if (caller != fCaller || !fInnerRun)
            return;
        const InnerRun innerRun = std::move(fInnerRun);
        fInnerRun = nullptr;
        innerRun();
    }

    Caller fCaller;
    int fNumQueriesBehindRecords = 0;
};

/// Three attributes beside the target (2), a second categorical variable (3) and the weight (5).
BINVarList SixVariables()
{
    return AVarList()
        .WithAttribute("a")
        .WithAttribute("b")
        .WithTarget("t", 2)
        .WithCategorical("u", 2)
        .WithAttribute("c")
        .WithWeight();
}

template<class Settings>
Settings WithHost(Settings settings, NestingHost& host)
{
    settings.SetProgressListener(&host);
    settings.SetCancelPointer(&host);
    settings.SetNSkippedCasesReports(3);
    return settings;
}

// What differs between the kinds of algorithms.

struct SupervisedKind
{
    static Supervised Make(NestingHost& host)
    {
        return Supervised(SixVariables(), WithHost(SupervisedSettings(), host));
    }

    static MCBinning::MCStatus Run(Supervised& run, IBINRecordSource& source, const Attributes* attributes)
    {
        return run->Run(&source, attributes, nullptr);
    }

    static BINAttributeTargetResults ResultOf(Supervised& run, int attribute) { return run.Pair(attribute, 2); }
};

struct EqualFrequencyKind
{
    static EqualFrequency Make(NestingHost& host)
    {
        return EqualFrequency(SixVariables(), WithHost(EqualFrequencySettings(3), host));
    }

    static MCBinning::MCStatus Run(EqualFrequency& run, IBINRecordSource& source, const Attributes* attributes)
    {
        return run->Run(&source, attributes);
    }

    static BINAttributeResults ResultOf(EqualFrequency& run, int attribute) { return run.Attribute(attribute); }
};

template<class Kind>
class NestedRun : public testing::Test
{
public:
    /// What Run does for the list without any inner call. The status is that of the object.
    static auto Undisturbed(const Attributes* attributes)
    {
        NestingHost host(Caller::kNext);
        auto run = Kind::Make(host);
        Kind::Run(run, host, attributes);
        return std::make_pair(run.All(), run->GetStatus());
    }
};

using BothKinds = testing::Types<SupervisedKind, EqualFrequencyKind>;
TYPED_TEST_SUITE(NestedRun, BothKinds, ); // the empty argument is for pedantic compilers

} // namespace

TYPED_TEST(NestedRun, TheOuterCallTreatsItsOwnListWhateverTheInnerOneIsGiven)
{
    const Attributes own{0, 5, 1, -1, 4, 3, 0, 1, 4, 3, 0, 1};
    const Attributes shorter{4};
    const Attributes longer(200, 1);
    const Attributes refused{-1, 77};
    const Attributes* const innerLists[] = {&shorter, &longer, &refused, &own, nullptr};
    const auto [expected, expectedStatus] = this->Undisturbed(&own);
    ASSERT_EQ(11U, expected.size()) << "a negative index leaves no result";

    for (const auto& [caller, name] : kCallers)
    {
        for (const Attributes* innerList : innerLists)
        {
            SCOPED_TRACE(name + (innerList != nullptr ? " with " + std::to_string(innerList->size()) : " with all"s));
            NestingHost host(caller);
            auto run = TypeParam::Make(host);
            Attributes handedOver = own;
            std::size_t numBefore = 0;
            std::size_t numAfter = 0;
            host.fInnerRun = [&]
            {
                numBefore = run.All().size();
                TypeParam::Run(run, host, innerList);
                numAfter = run.All().size();
                handedOver.assign(1000000, 77);
                run->GetSettings()->SetNumberOfBins(77);
                if (host.fNumHasNext > 1) // some call is reading, or has read
                    run->GetSettings()->SetRightBorderClosed(false);
            };

            TypeParam::Run(run, host, &handedOver);

            EXPECT_EQ(nullptr, host.fInnerRun) << "there was an inner call";
            EXPECT_EQ(expectedStatus, run->GetStatus());
            auto results = run.All();
            ASSERT_EQ(expected.size(), results.size() - (numAfter - numBefore));
            const auto first = results.begin() + static_cast<std::ptrdiff_t>(numBefore);
            results.erase(first, first + static_cast<std::ptrdiff_t>(numAfter - numBefore));
            for (std::size_t i = 0; i < expected.size(); ++i) ExpectSame(expected[i], results[i]);
        }
    }
}

TYPED_TEST(NestedRun, TheInnerCallHasDataUnlessTheRecordsAreBeingRead)
{
    for (const auto& [caller, name] : kCallers)
    {
        SCOPED_TRACE(name);
        const bool isInPass = caller == Caller::kHasNext || caller == Caller::kNext || caller == Caller::kQueryInPass ||
                              caller == Caller::kListenerInPass;
        NestingHost host(caller);
        auto run = TypeParam::Make(host);
        MCBinning::MCStatus inner(MCBinning::BINStatusNoResults, false);
        const Attributes second{1};
        host.fInnerRun = [&] { inner = TypeParam::Run(run, host, &second); };
        const Attributes first{0};

        EXPECT_FALSE(TypeParam::Run(run, host, &first).IsError());

        EXPECT_EQ(isInPass ? MCBinning::BINStatusNoRecords : 0, inner.IsError() ? inner.GetErrorCode() : 0);
        EXPECT_EQ(isInPass ? 1U : 2U, run.All().size());
        EXPECT_EQ(40, host.fNumNext) << "each record is read once";
        EXPECT_EQ(70.0 + 9.0, TypeParam::ResultOf(run, 0).GetTotalWeight());
    }
}
