#include "tools/CodeTexts.h"

namespace Tool {

const StatsRegistry::KelTypeDef* FindType(const std::string& name) {
    for (uint32_t i = 0; i < kelMaxTypeDefs; ++i) {
        const auto& t = kelTypeDefsLookupTab[i];
        if (t.name != nullptr && name == t.name) return &t;
    }
    return nullptr;
}

std::vector<EnumEntry> EnumEntries(const std::string& enumName) {
    std::vector<EnumEntry> out;
    const auto* t = FindType(enumName);
    if (t == nullptr || t->kind != StatsRegistry::KEL_KIND_ENUM || t->elemIndexOrTable.elements == nullptr) return out;
    for (uintptr_t i = 0; i < t->elemTypeOrCount.count; ++i) {
        const auto& e = t->elemIndexOrTable.elements[i];
        out.push_back(EnumEntry{e.value, e.name ? e.name : "", e.text ? e.text : ""});
    }
    return out;
}

std::string EnumText(const std::string& enumName, int64_t value) {
    for (const auto& e : EnumEntries(enumName)) {
        if (e.value == value) return e.text;
    }
    return std::to_string(value);
}

std::string ObjectTypeText(int32_t code) { return EnumText("SRStatObjectType", code); }
std::string UnitText(int32_t code) { return EnumText("SRStatUnit", code); }
std::string ValueTypeText(int32_t code) { return EnumText("SRStatValueType", code); }
std::string RollupText(int32_t code) { return EnumText("SRStatRollupType", code); }
std::string IdMapTypeText(int32_t code) { return EnumText("SRStatIdMappingType", code); }
std::string ParamTypeText(int32_t code) { return EnumText("SRStatParamType", code); }

}  // namespace Tool
