#include "catalogue/StatLevels.h"

#include "tarnstats/StatCatalogue.h"
#include "tarnstats/StatRecords.h"

namespace StatsRegistry {
namespace Catalogue {

namespace {

constexpr StatLevel kSyntheticVmLevel = {"vm", SR_IDMAPTYPE_VM_MOID, SR_PARAMTYPE_STRING, true, true};

}  // namespace

StatLevels GetStatLevels(uint32_t statId) noexcept {
    const StatMetadata& stat = statMetadataTab[statId];
    StatLevels levels;
    for (uint32_t j = 0; j < stat.numAttributes; ++j) {
        const StatAttributeMetadata& attribute = statAttributesTab[stat.attributeIds[j]];
        if (attribute.idMapType == SR_IDMAPTYPE_VNIC_TO_PORT_ID) levels.level[levels.count++] = kSyntheticVmLevel;
        levels.level[levels.count++] =
            StatLevel{attribute.name, attribute.idMapType, attribute.type, attribute.allowWildCard != 0, false};
    }
    return levels;
}

}  // namespace Catalogue
}  // namespace StatsRegistry
