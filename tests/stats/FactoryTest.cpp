#include <gtest/gtest.h>

#include "Plinth/Service.h"
#include "tarnstats/KELStatsImpl.h"

namespace {

using namespace StatsRegistry;

// The application, its logging service and the loggers live for the whole process; creating one
// stats object first makes them exist before the counts are taken.
void WarmUp() {
    Plinth::Ref<KELStats> first;
    KELStatsFactory::GetKELStats(first);
}

TEST(Factory, EmptyRefReceivesANewObjectWithOneReference) {
    WarmUp();
    const long before = Plinth::ObjectImpl::LiveObjects();
    {
        Plinth::Ref<KELStats> stats;
        KELStatsFactory::GetKELStats(stats);
        ASSERT_TRUE(stats);
        EXPECT_EQ(stats->GetRefCount(), 1);
        auto* impl = dynamic_cast<KELStatsImpl*>(stats.Get());
        ASSERT_NE(impl, nullptr);
        ASSERT_NE(impl->GetLogger(), nullptr);
        EXPECT_EQ(impl->GetLogger()->GetName(), "KELStatsImpl");
    }
    EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before);
}

TEST(Factory, EveryCallGivesANewObjectAndReleasesTheOldOne) {
    WarmUp();
    const long before = Plinth::ObjectImpl::LiveObjects();
    Plinth::Ref<KELStats> a, b;
    KELStatsFactory::GetKELStats(a);
    KELStatsFactory::GetKELStats(b);
    EXPECT_NE(a.Get(), b.Get());
    const long withTwo = Plinth::ObjectImpl::LiveObjects();

    Plinth::Ref<KELStats> keep = a;  // the old object survives while someone else holds it
    KELStats* old = a.Get();
    KELStatsFactory::GetKELStats(a);
    EXPECT_NE(a.Get(), old);
    EXPECT_EQ(keep->GetRefCount(), 1);
    EXPECT_EQ(a->GetRefCount(), 1);

    KELStatsFactory::GetKELStats(b);  // b's old object held only by b: destroyed
    EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), withTwo + 1);
    keep.Reset();
    EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), withTwo);
    a.Reset();
    b.Reset();
    // The two loggers stay with the logging service; only the stats objects go.
    EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before);
}

TEST(Factory, ObjectsShareTheirNamedLogger) {
    Plinth::Ref<KELStats> a, b;
    KELStatsFactory::GetKELStats(a);
    KELStatsFactory::GetKELStats(b);
    EXPECT_EQ(dynamic_cast<KELStatsImpl*>(a.Get())->GetLogger(), dynamic_cast<KELStatsImpl*>(b.Get())->GetLogger());
}

}  // namespace
