// The attribute levels of a stat as the stat list and the code caches present them.
//
// A stat's levels are its catalogue attributes in order, each attribute with id-map type
// SR_IDMAPTYPE_VNIC_TO_PORT_ID preceded by a synthetic VM level ("vm", SR_IDMAPTYPE_VM_MOID,
// SR_PARAMTYPE_STRING, wildcard allowed). This is the one place that rule lives: GetStatsList and
// the code caches both take their levels from here, so attribute indexes agree between them.
// No allocation, no lock, never throws; names point into the catalogue (static storage).
#pragma once

#include <cstdint>

namespace StatsRegistry {
namespace Catalogue {

// Two catalogue levels, each of which may be preceded by a synthetic level.
constexpr unsigned kMaxStatLevels = 4;

struct StatLevel {
    const char* name;
    int32_t idMapType;      // SRStatIdMappingType
    int32_t dataType;       // SRStatParamType
    bool allowWildCard;
    bool synthetic;         // the VM level put before a vNic port id; not in the catalogue
};

struct StatLevels {
    unsigned count = 0;
    StatLevel level[kMaxStatLevels] = {};
};

// REQUIRES: statId < statIdMax.
StatLevels GetStatLevels(uint32_t statId) noexcept;

}  // namespace Catalogue
}  // namespace StatsRegistry
