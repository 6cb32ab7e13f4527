#ifndef MCOBNQRT_TESTS_TWORUNS_H
#define MCOBNQRT_TESTS_TWORUNS_H

#include "tests/support/runs.h"

#include <algorithm>
#include <utility>

// What the loops over all calls and over all allocations disturb: a first run, which reads the records and bins all,
// and a second one of the same object, which bins two attributes again, a supervised one against another target.

/// Values for two attributes, the target, a second categorical variable and a weight. Some of each are missing, and
/// every 25th record counts nowhere.
inline RecordTable SomeRecords(int count)
{
    RecordTable records;
    for (int i = 0; i < count; ++i)
    {
        const int size = i * 7 % 24;
        std::vector<double> row{1.0 * size, 1.0 * (size / 4), 1.0 * (size / 8), 1.0 * (size / 12), 0.5 + i % 3};
        if (i % 11 < 4)
            row[static_cast<std::size_t>(i % 11)] = MCMV::gMissingValue;
        if (i % 25 == 0)
            row[4] = 0.0;
        records.Add(row);
    }
    return records;
}

/// Has the first attribute of SomeRecords() pre-binned.
inline BINSettings PreBinningSettings()
{
    BINSettings settings = SupervisedSettings();
    settings.SetNumDistinctValueThreshold(10);
    return settings;
}

inline MCBinning::MCStatus RunSecond(Supervised& host, RecordTable& records)
{
    return host.Run(records, {0, 1}, {3, 3});
}

inline MCBinning::MCStatus RunSecond(EqualFrequency& host, RecordTable& records)
{
    return host.Run(records, {0, 1});
}

inline std::pair<int, int> EntryOf(const BINAttributeTargetResults& result)
{
    return {result.GetAttributeIndex(), result.GetTargetIndex()};
}

inline std::pair<int, int> EntryOf(const BINAttributeResults& result)
{
    return {result.GetAttributeIndex(), -1};
}

template<class Results>
struct Outcome
{
    MCBinning::MCStatus fFirst;
    MCBinning::MCStatus fSecond;
    std::vector<Results> fResults;
};

/// Every result is the undisturbed one to the last bit, or says that `failure` spoilt it, and then the run says so too.
template<class Results>
void ExpectSound(const Outcome<Results>& undisturbed, const Outcome<Results>& disturbed, long failure)
{
    for (const long code : {disturbed.fFirst.GetErrorCode(), disturbed.fSecond.GetErrorCode()})
        EXPECT_TRUE(code == 0 || code == failure || code == MCBinning::BINStatusSomeResultsFlagged) << code;
    const bool isAllOK = disturbed.fFirst.IsOK() && disturbed.fSecond.IsOK();
    EXPECT_TRUE(!isAllOK || disturbed.fResults.size() == undisturbed.fResults.size());
    for (const Results& result : disturbed.fResults)
    {
        const auto twin = std::find_if(undisturbed.fResults.begin(), undisturbed.fResults.end(),
                                       [&](const Results& candidate) { return EntryOf(candidate) == EntryOf(result); });
        ASSERT_NE(undisturbed.fResults.end(), twin);
        if (result.GetStatus().IsOK())
        {
            ExpectSame(*twin, result);
        }
        else
        {
            EXPECT_TRUE(!isAllOK && CodeOf(result) == failure) << CodeOf(result);
        }
    }
}

#endif
