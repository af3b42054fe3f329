// The generated schema of the kernel's sysinfo tree, exported as constant data.
//
// A node id is an index into kelNodesLookupTab; a type index an index into kelTypeDefsLookupTab;
// -1 means none. A pointer to a type record equals kelTypeDefsLookupTab + its index. On 32-bit
// x86 the records are byte for byte: KelTypeDef 28, KelField 20, KelEnumElement 12, KelNode 76
// bytes (checked below at compile time); on x86-64 fields keep order and widths, pointers take
// 8 bytes, and KelNode stays packed to 4 so its hash keeps offset 52.
// The per-type member (…Fields) and element (…Elements) tables are declared in the generated
// header "tarnstats/SysinfoSchemaTables.h".
//
// Guarantees: every object here is constant-initialised (no code runs at load time), never
// written, and safe to read from any number of threads. The library owns all of it.
// KelNode is packed: copy its fields out (binding a non-const reference to one does not compile).
#pragma once

#include <cstddef>
#include <cstdint>

#include "tarnstats/Export.h"

namespace StatsRegistry {

enum KelTypeKind : uint32_t { KEL_KIND_SCALAR = 0, KEL_KIND_ARRAY = 1, KEL_KIND_STRUCT = 2, KEL_KIND_ENUM = 3 };

struct KelTypeDef;

struct KelField {
    const char* name;
    const KelTypeDef* typeDef;
    uint32_t type;
    uint32_t offset;
    const char* description;
};

struct KelEnumElement {
    const char* name;
    int32_t value;
    const char* text;
};

// elemTypeOrCount / elemIndexOrTable hold a number or a pointer depending on the kind; the
// constructors pick the member so that the tables can be constexpr.
union KelTypeRef {
    constexpr KelTypeRef() : count(0) {}
    constexpr explicit KelTypeRef(uintptr_t n) : count(n) {}
    constexpr explicit KelTypeRef(const KelTypeDef* t) : elemType(t) {}

    uintptr_t count;              // structure: member count; enumeration: element count; scalar: 0
    const KelTypeDef* elemType;   // array: element type record
};
union KelTypeTable {
    constexpr KelTypeTable() : index(0) {}
    constexpr explicit KelTypeTable(uintptr_t i) : index(i) {}
    constexpr explicit KelTypeTable(const KelField* f) : fields(f) {}
    constexpr explicit KelTypeTable(const KelEnumElement* e) : elements(e) {}

    uintptr_t index;              // array: element type index; scalar: 0
    const KelField* fields;       // structure
    const KelEnumElement* elements;  // enumeration
};

struct KelTypeDef {
    const char* name;
    uint32_t kind;                // KelTypeKind
    uint32_t size;
    const char* format;           // scalar: print format; struct/enum: description; array: null
    KelTypeRef elemTypeOrCount;
    KelTypeTable elemIndexOrTable;
    uint32_t isFlagSet;
};

struct KelNode {
    uint32_t id;
    uint8_t isLeaf;
    uint8_t hasInput;
    uint8_t isUntypedLeaf;
    uint8_t isInstance;
    uint8_t flag4;
    uint8_t flag5;
    uint8_t isIntegerInstance;
    uint8_t flag7;
    int32_t parent;
    int32_t sibling;
    int32_t child;
    uint32_t outputSize;
    int32_t outputType;
    uint32_t inputSize;
    int32_t inputType;
    uint32_t output2Size;
    int32_t output2Type;
    int32_t statLink;
    uint64_t hash;
    const char* name;
    const KelTypeDef* outputTypeDef;
    const KelTypeDef* inputTypeDef;
    const KelTypeDef* output2TypeDef;
} __attribute__((packed, aligned(4)));

#if defined(__i386__)
static_assert(sizeof(KelTypeDef) == 28 && offsetof(KelTypeDef, kind) == 4 &&
                  offsetof(KelTypeDef, size) == 8 && offsetof(KelTypeDef, format) == 12 &&
                  offsetof(KelTypeDef, elemTypeOrCount) == 16 &&
                  offsetof(KelTypeDef, elemIndexOrTable) == 20 &&
                  offsetof(KelTypeDef, isFlagSet) == 24,
              "KelTypeDef layout");
static_assert(sizeof(KelField) == 20 && offsetof(KelField, typeDef) == 4 &&
                  offsetof(KelField, type) == 8 && offsetof(KelField, offset) == 12 &&
                  offsetof(KelField, description) == 16,
              "KelField layout");
static_assert(sizeof(KelEnumElement) == 12 && offsetof(KelEnumElement, value) == 4 &&
                  offsetof(KelEnumElement, text) == 8,
              "KelEnumElement layout");
static_assert(sizeof(KelNode) == 76 && offsetof(KelNode, isLeaf) == 4 &&
                  offsetof(KelNode, hasInput) == 5 && offsetof(KelNode, isUntypedLeaf) == 6 &&
                  offsetof(KelNode, isInstance) == 7 && offsetof(KelNode, flag4) == 8 &&
                  offsetof(KelNode, flag5) == 9 && offsetof(KelNode, isIntegerInstance) == 10 &&
                  offsetof(KelNode, flag7) == 11 && offsetof(KelNode, parent) == 12 &&
                  offsetof(KelNode, sibling) == 16 && offsetof(KelNode, child) == 20 &&
                  offsetof(KelNode, outputSize) == 24 && offsetof(KelNode, outputType) == 28 &&
                  offsetof(KelNode, inputSize) == 32 && offsetof(KelNode, inputType) == 36 &&
                  offsetof(KelNode, output2Size) == 40 && offsetof(KelNode, output2Type) == 44 &&
                  offsetof(KelNode, statLink) == 48 && offsetof(KelNode, hash) == 52 &&
                  offsetof(KelNode, name) == 60 && offsetof(KelNode, outputTypeDef) == 64 &&
                  offsetof(KelNode, inputTypeDef) == 68 && offsetof(KelNode, output2TypeDef) == 72,
              "KelNode layout");
#elif defined(__x86_64__)
static_assert(sizeof(KelTypeDef) == 48 && offsetof(KelTypeDef, format) == 16 &&
                  offsetof(KelTypeDef, elemTypeOrCount) == 24 &&
                  offsetof(KelTypeDef, elemIndexOrTable) == 32 &&
                  offsetof(KelTypeDef, isFlagSet) == 40,
              "KelTypeDef layout");
static_assert(sizeof(KelField) == 32 && offsetof(KelField, type) == 16 &&
                  offsetof(KelField, offset) == 20 && offsetof(KelField, description) == 24,
              "KelField layout");
static_assert(sizeof(KelEnumElement) == 24 && offsetof(KelEnumElement, value) == 8 &&
                  offsetof(KelEnumElement, text) == 16,
              "KelEnumElement layout");
static_assert(sizeof(KelNode) == 92 && offsetof(KelNode, statLink) == 48 &&
                  offsetof(KelNode, hash) == 52 && offsetof(KelNode, name) == 60 &&
                  offsetof(KelNode, output2TypeDef) == 84,
              "KelNode layout");
#endif

}  // namespace StatsRegistry

extern "C" {
// Counts of the two tables (1061 and 1711), the hash of the whole set, and the tables.
TARNSTATS_EXPORT extern const uint32_t kelMaxTypeDefs;
TARNSTATS_EXPORT extern const uint32_t kelMaxNodes;
TARNSTATS_EXPORT extern const uint64_t KEL_ALL_IFACE_HASH;
TARNSTATS_EXPORT extern const StatsRegistry::KelTypeDef kelTypeDefsLookupTab[1061];
TARNSTATS_EXPORT extern const StatsRegistry::KelNode kelNodesLookupTab[1711];
}
