// The schema tables as the shared library exports them: every table under its own name, and the
// pointers inside the library's tables pointing at those exported objects.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "tarnstats/SysinfoSchema.h"

namespace {

using StatsRegistry::KelNode;
using StatsRegistry::KelTypeDef;

class SchemaExport : public ::testing::Test {
protected:
    void SetUp() override {
        handle_ = dlopen(TARNSTATS_LIBRARY_PATH, RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(handle_, nullptr) << dlerror();
    }
    void TearDown() override {
        if (handle_) dlclose(handle_);
    }
    const void* Symbol(const std::string& name) { return dlsym(handle_, name.c_str()); }

    void* handle_ = nullptr;
};

TEST_F(SchemaExport, EveryTableIsExportedUnderItsName) {
    auto maxTypes = static_cast<const uint32_t*>(Symbol("kelMaxTypeDefs"));
    auto maxNodes = static_cast<const uint32_t*>(Symbol("kelMaxNodes"));
    auto iface = static_cast<const uint64_t*>(Symbol("KEL_ALL_IFACE_HASH"));
    auto types = static_cast<const KelTypeDef*>(Symbol("kelTypeDefsLookupTab"));
    auto nodes = static_cast<const KelNode*>(Symbol("kelNodesLookupTab"));
    ASSERT_TRUE(maxTypes && maxNodes && iface && types && nodes);
    EXPECT_EQ(*maxTypes, 1061u);
    EXPECT_EQ(*maxNodes, 1711u);
    EXPECT_EQ(*iface, 0x16b7e0427b0d1430ull);

    int fieldTables = 0, elementTables = 0;
    for (uint32_t i = 0; i < *maxTypes; ++i) {
        const KelTypeDef& t = types[i];
        if (t.kind == StatsRegistry::KEL_KIND_STRUCT) {
            EXPECT_EQ(Symbol(std::string(t.name) + "Fields"), t.elemIndexOrTable.fields) << t.name;
            ++fieldTables;
        } else if (t.kind == StatsRegistry::KEL_KIND_ENUM) {
            EXPECT_EQ(Symbol(std::string(t.name) + "Elements"), t.elemIndexOrTable.elements)
                << t.name;
            ++elementTables;
        } else if (t.kind == StatsRegistry::KEL_KIND_ARRAY) {
            EXPECT_EQ(t.elemTypeOrCount.elemType, types + t.elemIndexOrTable.index) << t.name;
        }
    }
    EXPECT_EQ(fieldTables, 526);
    EXPECT_EQ(elementTables, 136);
    EXPECT_NE(Symbol("KEL_Empty_OutputFields"), nullptr);
    EXPECT_NE(Symbol("KEL_Empty_InputFields"), nullptr);

    // Type pointers in the library's node records point into its own type table.
    for (uint32_t i = 0; i < *maxNodes; ++i) {
        const KelNode& n = nodes[i];
        const KelTypeDef* out = n.outputTypeDef;
        EXPECT_EQ(out, n.outputType == -1 ? nullptr : types + n.outputType) << i;
    }
}

}  // namespace
