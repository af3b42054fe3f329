// Test fixture: a stats object over an installed in-memory tree, with every message captured.
//
// SetUp fills the code caches, creates a KELStatsImpl and opens every log level. Install(host)
// or InstallTree(tree) makes the tree the one every accessor reads; TearDown uninstalls it.
#pragma once

#include <gtest/gtest.h>

#include <memory>

#include "LogCapture.h"
#include "TarnCtl/SimTree.h"
#include "hostsim/Host.h"
#include "tarnstats/KELStatsImpl.h"

namespace TestSupport {

class StatsFixture : public ::testing::Test {
protected:
    void SetUp() override {
        StatsRegistry::KELStats::EnsureCodeCaches();
        StatsRegistry::KELStatsFactory::GetKELStats(stats);
        impl = dynamic_cast<StatsRegistry::KELStatsImpl*>(stats.Get());
        ASSERT_NE(impl, nullptr);
    }
    void TearDown() override { TarnCtl::Sim::Install(nullptr); }

    void Install(const HostSim::Host& h) {
        host = h;
        InstallTree(HostSim::BuildTree(host));
    }
    void InstallTree(std::shared_ptr<TarnCtl::Sim::Tree> t) {
        tree = std::move(t);
        TarnCtl::Sim::Install(tree);
    }
    // Messages at level 8, in order.
    std::vector<std::string> Warnings() const { return log.Texts(8); }

    LogCapture log;
    HostSim::Host host;
    std::shared_ptr<TarnCtl::Sim::Tree> tree;
    Plinth::Ref<StatsRegistry::KELStats> stats;
    StatsRegistry::KELStatsImpl* impl = nullptr;
};

// A stat set record: count, then (id, value) entries.
std::vector<uint8_t> Record(uint32_t numStats, const std::vector<std::pair<uint64_t, int64_t>>& entries);

}  // namespace TestSupport
