// The first GetStatsList calls of a process, made at the same moment from several threads: every
// caller must see both code caches complete when its call returns.
//
// This binary holds this one test only, so the caches are still empty when it starts.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>
#include <vector>

#include "Plinth/Ref.h"
#include "tarnstats/KELStats.h"

namespace {

using namespace StatsRegistry;

struct CallerView {
    size_t listed = 0;
    bool cachesMatchList = false;
};

// Whether both caches hold, for every stat, exactly the codes of the list's attribute levels.
bool CachesMatch(const Plinth::RefVector<StatDef>& list) {
    if (KELStats::_sStatAttrIdMapType.size() != 70 || KELStats::_sStatAttrDataType.size() != 70) return false;
    for (const auto& def : list) {
        const auto& idMap = KELStats::_sStatAttrIdMapType[def->id];
        const auto& data = KELStats::_sStatAttrDataType[def->id];
        if (idMap.size() != def->attributes.size() || data.size() != def->attributes.size()) return false;
        for (size_t j = 0; j < def->attributes.size(); ++j) {
            if (idMap[j] != def->attributes[j].idMapType || data[j] != def->attributes[j].dataType) return false;
        }
    }
    return true;
}

TEST(FirstCall, ConcurrentFirstCallsAllSeeCompleteCaches) {
    ASSERT_TRUE(KELStats::_sStatAttrIdMapType.empty());
    ASSERT_TRUE(KELStats::_sStatAttrDataType.empty());

    constexpr int kThreads = 8;
    std::vector<CallerView> views(kThreads);
    std::atomic<int> waiting{kThreads};
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
        threads.emplace_back([&views, &waiting, t] {
            Plinth::Ref<KELStats> stats;
            KELStatsFactory::GetKELStats(stats);
            Plinth::RefVector<StatDef> list;
            // Barrier: all threads make their first call together.
            waiting.fetch_sub(1);
            while (waiting.load() > 0) std::this_thread::yield();
            stats->GetStatsList(list);
            views[t].listed = list.size();
            views[t].cachesMatchList = CachesMatch(list);
        });
    }
    for (auto& thread : threads) thread.join();

    for (int t = 0; t < kThreads; ++t) {
        EXPECT_EQ(views[t].listed, 70u) << "thread " << t;
        EXPECT_TRUE(views[t].cachesMatchList) << "thread " << t << " saw incomplete caches";
    }
    ASSERT_EQ(KELStats::_sStatAttrIdMapType.size(), 70u);
    ASSERT_EQ(KELStats::_sStatAttrDataType.size(), 70u);
    EXPECT_EQ(KELStats::_sStatAttrIdMapType[33], (std::vector<long>{3, 5}));
    EXPECT_EQ(KELStats::_sStatAttrDataType[33], (std::vector<long>{1, 0}));
}

}  // namespace
