// Filling of the two code caches of KELStats.
//
// Both caches are built completely in locals and moved in under std::call_once, so no thread ever
// sees them half filled, and every caller of EnsureCodeCaches sees them filled when it returns.
// Should building throw (allocation failure), the caches stay empty and the next call tries again.
#include <mutex>
#include <utility>
#include <vector>

#include "catalogue/StatLevels.h"
#include "tarnstats/KELStats.h"
#include "tarnstats/StatCatalogue.h"

namespace StatsRegistry {

namespace {

std::once_flag codeCachesFilled;

}  // namespace

void KELStats::EnsureCodeCaches() {
    std::call_once(codeCachesFilled, [] {
        std::vector<std::vector<long>> idMapTypes;
        std::vector<std::vector<long>> dataTypes;
        idMapTypes.reserve(statIdMax);
        dataTypes.reserve(statIdMax);
        for (uint32_t statId = 0; statId < statIdMax; ++statId) {
            const Catalogue::StatLevels levels = Catalogue::GetStatLevels(statId);
            std::vector<long>& idMapEntry = idMapTypes.emplace_back();
            std::vector<long>& dataEntry = dataTypes.emplace_back();
            idMapEntry.reserve(levels.count);
            dataEntry.reserve(levels.count);
            for (unsigned j = 0; j < levels.count; ++j) {
                idMapEntry.push_back(levels.level[j].idMapType);
                dataEntry.push_back(levels.level[j].dataType);
            }
        }
        _sStatAttrIdMapType = std::move(idMapTypes);
        _sStatAttrDataType = std::move(dataTypes);
    });
}

}  // namespace StatsRegistry
