// A minimal program built against the installed library: it obtains a stats object and lists the
// stats.
#include <cstdio>

#include "tarnstats/KELStats.h"

int main() {
    Plinth::Ref<StatsRegistry::KELStats> stats;
    StatsRegistry::KELStatsFactory::GetKELStats(stats);
    if (!stats || stats->GetRefCount() != 1) return 1;
    Plinth::RefVector<StatsRegistry::StatDef> defs;
    stats->GetStatsList(defs);
    std::printf("%zu stats\n", defs.size());
    return defs.size() == 70 ? 0 : 1;
}
