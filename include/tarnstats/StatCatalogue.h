// The compiled-in stat catalogue, exported as constant data under plain (unmangled) names.
//
// Guarantees: the tables are constant-initialised and never written. A stat is identified by its
// index in statMetadataTab (0 to statIdMax - 1); attribute ids index statAttributesTab, set ids
// statSetTab, statInfoIds statSetStatInfoTab; -1 means none. Tables are read by index, never
// searched. Stat names are not unique; the pair of name and objectType is.
// Layout: on 32-bit x86 the records are byte for byte StatMetadata 60, StatAttributeMetadata 16,
// StatSet 132, StatSetStatInfo 8 bytes (checked below at compile time). On wider targets fields
// keep their order and integer widths and pointers take the target's width.
#pragma once

#include <cstddef>
#include <cstdint>

#include "tarnstats/Export.h"

namespace StatsRegistry {

// Codes of the StatMetadata columns.
enum SRStatObjectType : int32_t {
    SR_OBJECTTYPE_VIRTUALMACHINE = 0,
    SR_OBJECTTYPE_VIRTUALCPU = 1,
    SR_OBJECTTYPE_VIRTUALNIC = 2,
    SR_OBJECTTYPE_VIRTUALDISK = 3,
    SR_OBJECTTYPE_VM_LUN = 4,
    SR_OBJECTTYPE_HOST = 5,
    SR_OBJECTTYPE_PHYSICALCPU = 6,
    SR_OBJECTTYPE_PHYSICALNIC = 7,
    SR_OBJECTTYPE_STORAGEADAPTER = 8,
    SR_OBJECTTYPE_STORAGEPATH = 9,
    SR_OBJECTTYPE_HOST_LUN = 10,
    SR_OBJECTTYPE_DATASTORE = 11,
    SR_OBJECTTYPE_LUN = 12,
};
enum SRStatTransformType : int32_t {
    SR_TRANSFORMTYPE_NONE = 0,
    SR_TRANSFORMTYPE_DELTA = 1,
    SR_TRANSFORMTYPE_RATE = 2,
};
enum SRStatValueType : int32_t {
    SR_VALUETYPE_ABSOLUTE = 0,
    SR_VALUETYPE_DELTA = 1,
    SR_VALUETYPE_RATE = 2,
};
enum SRStatUnit : int32_t {
    SR_UNIT_PERCENT = 0,
    SR_UNIT_KILOBYTE = 1,
    SR_UNIT_MEGABYTE = 2,
    SR_UNIT_MEGAHERTZ = 3,
    SR_UNIT_NUMBER = 4,
    SR_UNIT_MICROSECOND = 5,
    SR_UNIT_MILLISECOND = 6,
    SR_UNIT_SECOND = 7,
    SR_UNIT_KILOBYTEPERSECOND = 8,
    SR_UNIT_MEGABYTEPERSECOND = 9,
    SR_UNIT_WATT = 10,
    SR_UNIT_JOULE = 11,
};
enum SRStatRollupType : int32_t {
    SR_ROLLUP_NONE = 0,
    SR_ROLLUP_AVERAGE = 1,
    SR_ROLLUP_MAX = 2,
    SR_ROLLUP_MIN = 3,
    SR_ROLLUP_LATEST = 4,
    SR_ROLLUP_SUMMATION = 5,
};
enum SRStatOptions : int32_t {
    SR_STATOPTIONS_INVALID = 0,  // no flags
    SR_STATOPTIONS_HIDDEN = 1,
};

// One stat (record of statMetadataTab).
struct StatMetadata {
    const char* name;           // dotted stat name, at most 30 characters
    uint32_t reserved;          // 0
    int32_t objectType;         // SRStatObjectType
    int32_t transformType;      // SRStatTransformType
    int32_t valueType;          // SRStatValueType
    int32_t unit;               // SRStatUnit
    int32_t rollupType;         // SRStatRollupType
    int32_t statOptions;        // SRStatOptions
    const char* label;
    const char* description;
    const char* localization;   // locale of label and description
    int32_t statSetId;          // index into statSetTab, -1 for none
    uint32_t numAttributes;     // 0 to 2
    int32_t attributeIds[2];    // indexes into statAttributesTab; unused slots -1
};

// One attribute definition (record of statAttributesTab).
struct StatAttributeMetadata {
    int32_t idMapType;          // SRStatIdMappingType
    int32_t type;               // SRStatParamType
    const char* name;
    int32_t allowWildCard;      // non-zero: the level accepts "*"
};

// One stat set: the stats that one read of one sysinfo node returns (record of statSetTab).
struct StatSet {
    const char* name;           // not unique
    uint32_t reserved;          // 0
    uint32_t valuesSize;        // 8 * numStats
    uint32_t node;              // index into kelNodesLookupTab
    uint32_t numAttributes;     // shared by all members
    int32_t attributeIds[2];    // equal to every member's; unused slots -1
    uint32_t numStats;          // 1 to 7
    int32_t statInfoIds[25];    // indexes into statSetStatInfoTab in member order; unused slots -1
};

// One member of a stat set (record of statSetStatInfoTab).
struct StatSetStatInfo {
    uint32_t statId;
    uint32_t offset;            // byte offset of the member's 8-byte value in the set's value area
};

// Record layouts: exact on 32-bit x86; on x86-64 the same order with 8-byte pointers.
#if defined(__i386__)
static_assert(sizeof(StatMetadata) == 60, "StatMetadata size");
static_assert(offsetof(StatMetadata, name) == 0, "StatMetadata::name offset");
static_assert(offsetof(StatMetadata, reserved) == 4, "StatMetadata::reserved offset");
static_assert(offsetof(StatMetadata, objectType) == 8, "StatMetadata::objectType offset");
static_assert(offsetof(StatMetadata, transformType) == 12, "StatMetadata::transformType offset");
static_assert(offsetof(StatMetadata, valueType) == 16, "StatMetadata::valueType offset");
static_assert(offsetof(StatMetadata, unit) == 20, "StatMetadata::unit offset");
static_assert(offsetof(StatMetadata, rollupType) == 24, "StatMetadata::rollupType offset");
static_assert(offsetof(StatMetadata, statOptions) == 28, "StatMetadata::statOptions offset");
static_assert(offsetof(StatMetadata, label) == 32, "StatMetadata::label offset");
static_assert(offsetof(StatMetadata, description) == 36, "StatMetadata::description offset");
static_assert(offsetof(StatMetadata, localization) == 40, "StatMetadata::localization offset");
static_assert(offsetof(StatMetadata, statSetId) == 44, "StatMetadata::statSetId offset");
static_assert(offsetof(StatMetadata, numAttributes) == 48, "StatMetadata::numAttributes offset");
static_assert(offsetof(StatMetadata, attributeIds) == 52, "StatMetadata::attributeIds offset");
static_assert(sizeof(StatAttributeMetadata) == 16, "StatAttributeMetadata size");
static_assert(offsetof(StatAttributeMetadata, idMapType) == 0, "StatAttributeMetadata::idMapType offset");
static_assert(offsetof(StatAttributeMetadata, type) == 4, "StatAttributeMetadata::type offset");
static_assert(offsetof(StatAttributeMetadata, name) == 8, "StatAttributeMetadata::name offset");
static_assert(offsetof(StatAttributeMetadata, allowWildCard) == 12, "StatAttributeMetadata::allowWildCard offset");
static_assert(sizeof(StatSet) == 132, "StatSet size");
static_assert(offsetof(StatSet, name) == 0, "StatSet::name offset");
static_assert(offsetof(StatSet, reserved) == 4, "StatSet::reserved offset");
static_assert(offsetof(StatSet, valuesSize) == 8, "StatSet::valuesSize offset");
static_assert(offsetof(StatSet, node) == 12, "StatSet::node offset");
static_assert(offsetof(StatSet, numAttributes) == 16, "StatSet::numAttributes offset");
static_assert(offsetof(StatSet, attributeIds) == 20, "StatSet::attributeIds offset");
static_assert(offsetof(StatSet, numStats) == 28, "StatSet::numStats offset");
static_assert(offsetof(StatSet, statInfoIds) == 32, "StatSet::statInfoIds offset");
static_assert(sizeof(StatSetStatInfo) == 8, "StatSetStatInfo size");
static_assert(offsetof(StatSetStatInfo, statId) == 0, "StatSetStatInfo::statId offset");
static_assert(offsetof(StatSetStatInfo, offset) == 4, "StatSetStatInfo::offset offset");
#elif defined(__x86_64__)
static_assert(sizeof(StatMetadata) == 80, "StatMetadata size");
static_assert(offsetof(StatMetadata, name) == 0, "StatMetadata::name offset");
static_assert(offsetof(StatMetadata, reserved) == 8, "StatMetadata::reserved offset");
static_assert(offsetof(StatMetadata, objectType) == 12, "StatMetadata::objectType offset");
static_assert(offsetof(StatMetadata, transformType) == 16, "StatMetadata::transformType offset");
static_assert(offsetof(StatMetadata, valueType) == 20, "StatMetadata::valueType offset");
static_assert(offsetof(StatMetadata, unit) == 24, "StatMetadata::unit offset");
static_assert(offsetof(StatMetadata, rollupType) == 28, "StatMetadata::rollupType offset");
static_assert(offsetof(StatMetadata, statOptions) == 32, "StatMetadata::statOptions offset");
static_assert(offsetof(StatMetadata, label) == 40, "StatMetadata::label offset");
static_assert(offsetof(StatMetadata, description) == 48, "StatMetadata::description offset");
static_assert(offsetof(StatMetadata, localization) == 56, "StatMetadata::localization offset");
static_assert(offsetof(StatMetadata, statSetId) == 64, "StatMetadata::statSetId offset");
static_assert(offsetof(StatMetadata, numAttributes) == 68, "StatMetadata::numAttributes offset");
static_assert(offsetof(StatMetadata, attributeIds) == 72, "StatMetadata::attributeIds offset");
static_assert(sizeof(StatAttributeMetadata) == 24, "StatAttributeMetadata size");
static_assert(offsetof(StatAttributeMetadata, idMapType) == 0, "StatAttributeMetadata::idMapType offset");
static_assert(offsetof(StatAttributeMetadata, type) == 4, "StatAttributeMetadata::type offset");
static_assert(offsetof(StatAttributeMetadata, name) == 8, "StatAttributeMetadata::name offset");
static_assert(offsetof(StatAttributeMetadata, allowWildCard) == 16, "StatAttributeMetadata::allowWildCard offset");
static_assert(sizeof(StatSet) == 136, "StatSet size");
static_assert(offsetof(StatSet, name) == 0, "StatSet::name offset");
static_assert(offsetof(StatSet, reserved) == 8, "StatSet::reserved offset");
static_assert(offsetof(StatSet, valuesSize) == 12, "StatSet::valuesSize offset");
static_assert(offsetof(StatSet, node) == 16, "StatSet::node offset");
static_assert(offsetof(StatSet, numAttributes) == 20, "StatSet::numAttributes offset");
static_assert(offsetof(StatSet, attributeIds) == 24, "StatSet::attributeIds offset");
static_assert(offsetof(StatSet, numStats) == 32, "StatSet::numStats offset");
static_assert(offsetof(StatSet, statInfoIds) == 36, "StatSet::statInfoIds offset");
static_assert(sizeof(StatSetStatInfo) == 8, "StatSetStatInfo size");
static_assert(offsetof(StatSetStatInfo, statId) == 0, "StatSetStatInfo::statId offset");
static_assert(offsetof(StatSetStatInfo, offset) == 4, "StatSetStatInfo::offset offset");
#endif

}  // namespace StatsRegistry

extern "C" {
TARNSTATS_EXPORT extern const uint32_t statIdMax;
TARNSTATS_EXPORT extern const uint32_t statIdMap[70];
TARNSTATS_EXPORT extern const uint32_t statAttributeIdMax;
TARNSTATS_EXPORT extern const uint32_t statSetIdMax;
TARNSTATS_EXPORT extern const uint32_t statSetStatInfoIdMax;
TARNSTATS_EXPORT extern const StatsRegistry::StatSetStatInfo statSetStatInfoTab[63];
TARNSTATS_EXPORT extern const StatsRegistry::StatMetadata statMetadataTab[70];
TARNSTATS_EXPORT extern const StatsRegistry::StatAttributeMetadata statAttributesTab[27];
TARNSTATS_EXPORT extern const StatsRegistry::StatSet statSetTab[22];
}

#if defined(__i386__)
static_assert(sizeof(statIdMap) == 280 && sizeof(statSetStatInfoTab) == 504 && sizeof(statMetadataTab) == 4200 &&
                  sizeof(statAttributesTab) == 432 && sizeof(statSetTab) == 2904,
              "catalogue table sizes");
#endif
