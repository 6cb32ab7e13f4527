#include "base/bincancelmonitor.h"

#include <mcobnqrt/binprogressreporter.h>
#include <mcobnqrt/mcquerycancel.h>

#include <gtest/gtest.h>

namespace
{

struct YesOnTheSecondTime : MCQueryCancel
{
    bool QueryCancel() override { return ++fTimesAsked == 2; }
    int fTimesAsked = 0;
};

struct CancelsAndSaysNo : MCQueryCancel
{
    bool QueryCancel() override
    {
        fMonitor->Cancel();
        return false;
    }
    BINCancelMonitor* fMonitor = nullptr;
};

} // namespace

TEST(CancelMonitor, AsksNoQueryAfterAYes)
{
    YesOnTheSecondTime query, laterQuery;
    BINCancelMonitor monitor(&query);

    EXPECT_FALSE(monitor.IsCancelled());
    EXPECT_TRUE(monitor.IsCancelled());
    EXPECT_TRUE(monitor.IsCancelled());
    monitor.SetCancelPointer(&laterQuery);
    EXPECT_TRUE(monitor.IsCancelled());

    EXPECT_EQ(2, query.fTimesAsked);
    EXPECT_EQ(0, laterQuery.fTimesAsked);
}

TEST(CancelMonitor, StaysCancelledByAQueryThatCancelsAndSaysNo)
{
    CancelsAndSaysNo query;
    BINCancelMonitor monitor(nullptr);
    EXPECT_FALSE(monitor.IsCancelled());

    query.fMonitor = &monitor;
    monitor.SetCancelPointer(&query);

    EXPECT_TRUE(monitor.IsCancelled());
}

TEST(ProgressReporter, KnowsItsTwoMeasuresByTheirExactNames)
{
    BINProgressReporter reporter;
    EXPECT_EQ(0, reporter.DiscreteMeasure("IndexVar"));
    EXPECT_EQ(MCMV::gMissingValue, reporter.ScaleMeasure("elapsedTime"));

    reporter.SetValues(7, 1.5);

    EXPECT_EQ(7, reporter.DiscreteMeasure("IndexVar"));
    EXPECT_EQ(1.5, reporter.ScaleMeasure("elapsedTime"));
    EXPECT_EQ(-1, reporter.DiscreteMeasure("indexvar"));
    EXPECT_EQ(MCMV::gMissingValue, reporter.ScaleMeasure("elapsedtime"));
}
