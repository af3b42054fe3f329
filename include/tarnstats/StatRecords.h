// The records exchanged through the stats interface.
//
// StatDef, StatInstance and StatInstanceValue are reference counted (they start with no reference
// and travel in Plinth::Ref / Plinth::RefVector); their fields are filled by the producer right
// after construction and not changed once handed out. StatAttribute is a plain value type.
#pragma once

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "Plinth/Object.h"
#include "Plinth/Ref.h"
#include "tarnstats/Export.h"

namespace StatsRegistry {

// One attribute level of a stat.
class TARNSTATS_EXPORT StatAttribute {
public:
    StatAttribute() = default;
    StatAttribute(std::string name_, std::string attrType_, bool allowWildCard_, int32_t objectType_,
                  int32_t dataType_, int32_t idMapType_);
    StatAttribute(StatAttribute const& other);
    StatAttribute(StatAttribute&&) noexcept = default;
    StatAttribute& operator=(StatAttribute const&) = default;
    StatAttribute& operator=(StatAttribute&&) noexcept = default;
    ~StatAttribute();

    std::string name;
    std::string attrType;       // "vm" or "unknown type"
    bool allowWildCard = false;
    int32_t objectType = -1;    // 0 when attrType is "vm", -1 otherwise
    int32_t dataType = 0;       // SRStatParamType
    int32_t idMapType = 0;      // SRStatIdMappingType
};

// One stat of the catalogue.
class TARNSTATS_EXPORT StatDef : public Plinth::ObjectImpl {
public:
    StatDef() = default;
    ~StatDef() override;

    std::string name;
    long id = 0;
    int32_t valueType = 0;      // SRStatValueType
    int32_t unit = 0;           // SRStatUnit
    int32_t rollupType = 0;     // SRStatRollupType
    std::string label;
    std::string description;
    std::vector<StatAttribute> attributes;
};

// One stat instance: a request, or the concrete instance of a result.
class TARNSTATS_EXPORT StatInstance : public Plinth::ObjectImpl {
public:
    StatInstance() = default;
    StatInstance(long id, std::vector<std::string> instances) : statId(id), attrInstances(std::move(instances)) {}
    ~StatInstance() override;

    long statId = 0;
    std::vector<std::string> attrInstances;  // one per attribute level; "*" for every instance
};

// One result: a concrete instance and its value.
class TARNSTATS_EXPORT StatInstanceValue : public Plinth::ObjectImpl {
public:
    StatInstanceValue() = default;
    ~StatInstanceValue() override;

    Plinth::Ref<StatInstance> statInstance;
    int64_t value = 0;
};

// Id-map type codes (StatAttribute::idMapType).
enum SRStatIdMappingType : int32_t {
    SR_IDMAPTYPE_IDENTITY = 0,
    SR_IDMAPTYPE_VM_MOID_TO_WORLDID = 1,
    SR_IDMAPTYPE_VM_MOID_TO_WORLDGROUPID = 2,
    SR_IDMAPTYPE_VM_MOID = 3,
    SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE = 4,
    SR_IDMAPTYPE_VNIC_TO_PORT_ID = 5,
};

// Data type codes (StatAttribute::dataType).
enum SRStatParamType : int32_t {
    SR_PARAMTYPE_INT = 0,
    SR_PARAMTYPE_STRING = 1,
};

}  // namespace StatsRegistry
