// Runs in a process of its own: values are asked for before any stat list was built.
#include <gtest/gtest.h>

#include "StatsFixture.h"

namespace {

TEST(FirstCall, ValuesBeforeAnyStatListFillTheCachesFirst) {
    ASSERT_TRUE(StatsRegistry::KELStats::_sStatAttrIdMapType.empty());
    HostSim::Host host = HostSim::SampleHost();
    TarnCtl::Sim::Install(HostSim::BuildTree(host));
    Plinth::Ref<StatsRegistry::KELStats> stats;
    StatsRegistry::KELStatsFactory::GetKELStats(stats);
    Plinth::RefVector<StatsRegistry::StatInstance> requests;
    requests.Append(new StatsRegistry::StatInstance(49, {"*", "*"}));
    Plinth::RefVector<StatsRegistry::StatInstanceValue> values;
    stats->GetStatValues(requests, values);
    EXPECT_EQ(StatsRegistry::KELStats::_sStatAttrIdMapType.size(), 70u);
    EXPECT_EQ(StatsRegistry::KELStats::_sStatAttrDataType.size(), 70u);
    EXPECT_EQ(values.size(), HostSim::StatInstances(host, 49).size());
    TarnCtl::Sim::Install(nullptr);
}

}  // namespace
