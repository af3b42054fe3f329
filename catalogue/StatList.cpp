// KELStatsImpl::GetStatsList: one StatDef per stat of the catalogue, in stat id order.
#include <string>
#include <utility>
#include <vector>

#include "catalogue/StatLevels.h"
#include "tarnstats/KELStatsImpl.h"
#include "tarnstats/StatCatalogue.h"
#include "tarnstats/StatRecords.h"

namespace StatsRegistry {

namespace {

const char kVmAttrType[] = "vm";

StatAttribute MakeAttribute(const Catalogue::StatLevel& level) {
    std::string attrType =
        level.synthetic ? kVmAttrType : KELStats::GetAttrType(static_cast<unsigned int>(level.idMapType));
    const int32_t objectType = attrType == kVmAttrType ? 0 : -1;  // SR_OBJECTTYPE_VIRTUALMACHINE or none
    return StatAttribute(level.name, std::move(attrType), level.allowWildCard, objectType, level.dataType,
                         level.idMapType);
}

}  // namespace

void KELStatsImpl::GetStatsList(Plinth::RefVector<StatDef>& statDefs) {
    EnsureCodeCaches();

    // One working list for all stats; each StatDef gets an exact-size copy of it.
    std::vector<StatAttribute> working;
    for (uint32_t statId = 0; statId < statIdMax; ++statId) {
        const StatMetadata& stat = statMetadataTab[statId];
        working.clear();
        working.reserve(stat.numAttributes);
        const Catalogue::StatLevels levels = Catalogue::GetStatLevels(statId);
        for (unsigned j = 0; j < levels.count; ++j) working.push_back(MakeAttribute(levels.level[j]));

        Plinth::Ref<StatDef> def(new StatDef);
        def->name = stat.name;
        def->id = static_cast<long>(statId);
        def->valueType = stat.valueType;
        def->unit = stat.unit;
        def->rollupType = stat.rollupType;
        def->label = stat.label;
        def->description = stat.description;
        def->attributes.assign(working.begin(), working.end());  // into an empty list: exact size
        statDefs.push_back(std::move(def));  // the list's entry is now the only reference
    }
}

}  // namespace StatsRegistry
