// Display texts of the catalogue's codes, read from the exported sysinfo schema.
//
// The stat catalogue stores codes (object type, unit, value type, rollup, id-map type, data
// type); their names and texts are the element tables of the schema's enumerations
// (SRStatObjectType, SRStatUnit, ...). These helpers look the enumerations up by name in
// kelTypeDefsLookupTab, so the tool prints exactly the system's own texts.
//
// Guarantees: pure lookups over constant tables; nothing is cached or allocated beyond results.
// A value that the enumeration lacks gives its decimal text; an enumeration that the schema lacks
// gives no elements.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tarnstats/SysinfoSchema.h"

namespace Tool {

// The type record named `name`, or null.
const StatsRegistry::KelTypeDef* FindType(const std::string& name);

struct EnumEntry {
    int32_t value;
    std::string name;
    std::string text;
};
// The elements of the enumeration named `enumName`, in definition order.
std::vector<EnumEntry> EnumEntries(const std::string& enumName);
// The display text of `value` in that enumeration; the decimal value when it has no such element.
std::string EnumText(const std::string& enumName, int64_t value);

std::string ObjectTypeText(int32_t code);  // SRStatObjectType: "VM", "vNic", ...
std::string UnitText(int32_t code);        // SRStatUnit: "kiloBytesPerSecond", ...
std::string ValueTypeText(int32_t code);   // SRStatValueType
std::string RollupText(int32_t code);      // SRStatRollupType
std::string IdMapTypeText(int32_t code);   // SRStatIdMappingType
std::string ParamTypeText(int32_t code);   // SRStatParamType

}  // namespace Tool
