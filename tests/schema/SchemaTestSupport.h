// Small lookups over the exported schema tables for the schema tests.
//
// Requires: the tables of "tarnstats/SysinfoSchemaTables.h" linked in. Guarantees: no lookup
// writes anything; TypeIndex returns -1 for an unknown name. Throws nothing.
#pragma once

#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "tarnstats/SysinfoSchemaTables.h"

namespace SchemaTest {

using StatsRegistry::KelEnumElement;
using StatsRegistry::KelField;
using StatsRegistry::KelNode;
using StatsRegistry::KelTypeDef;

inline const KelTypeDef& Type(int32_t index) { return kelTypeDefsLookupTab[index]; }
inline const KelNode& Node(int32_t id) { return kelNodesLookupTab[id]; }

inline int32_t TypeIndex(const char* name) {
    for (uint32_t i = 0; i < kelMaxTypeDefs; ++i) {
        if (std::strcmp(kelTypeDefsLookupTab[i].name, name) == 0) return static_cast<int32_t>(i);
    }
    return -1;
}

// Ids of the nodes whose parent is `id`, highest first (the root is not its own child).
inline std::vector<int32_t> ChildrenByParent(int32_t id) {
    std::vector<int32_t> out;
    for (int32_t i = static_cast<int32_t>(kelMaxNodes) - 1; i > 0; --i) {
        if (kelNodesLookupTab[i].parent == id) out.push_back(i);
    }
    return out;
}

// Ids of `id` and every node below it.
inline std::vector<int32_t> Subtree(int32_t id) {
    std::vector<int32_t> out{id};
    for (size_t k = 0; k < out.size(); ++k) {
        for (int32_t c : ChildrenByParent(out[k])) out.push_back(c);
    }
    return out;
}

// Alignment of a type in the 32-bit x86 layout, where 8-byte members need only 4 bytes.
inline uint32_t X86Alignment(const KelTypeDef& t) {
    switch (t.kind) {
    case StatsRegistry::KEL_KIND_SCALAR: return t.size < 4 ? (t.size ? t.size : 1) : 4;
    case StatsRegistry::KEL_KIND_ENUM: return 4;
    case StatsRegistry::KEL_KIND_ARRAY: return X86Alignment(*t.elemTypeOrCount.elemType);
    default: {
        uint32_t a = 1;
        for (uintptr_t k = 0; k < t.elemTypeOrCount.count; ++k) {
            uint32_t m = X86Alignment(*t.elemIndexOrTable.fields[k].typeDef);
            a = m > a ? m : a;
        }
        return a;
    }
    }
}

inline bool EndsWith(const std::string& s, const std::string& tail) {
    return s.size() >= tail.size() && s.compare(s.size() - tail.size(), tail.size(), tail) == 0;
}

}  // namespace SchemaTest
