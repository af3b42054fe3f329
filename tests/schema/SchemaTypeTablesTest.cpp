// Rules over the whole type table and its member and element tables, and its fixed rows.
#include <gtest/gtest.h>

#include <map>
#include <set>
#include <string>

#include "SchemaTestSupport.h"
#include "tarnstats/StatCatalogue.h"
#include "tarnstats/StatRecords.h"

namespace {

using namespace SchemaTest;
using StatsRegistry::KEL_KIND_ARRAY;
using StatsRegistry::KEL_KIND_ENUM;
using StatsRegistry::KEL_KIND_SCALAR;
using StatsRegistry::KEL_KIND_STRUCT;

bool ValuesOutOfOrder(const KelTypeDef& t) {
    for (uintptr_t k = 1; k < t.elemTypeOrCount.count; ++k) {
        if (t.elemIndexOrTable.elements[k].value < t.elemIndexOrTable.elements[k - 1].value) {
            return true;
        }
    }
    return false;
}

TEST(SchemaTypes, CountsByKind) {
    ASSERT_EQ(kelMaxTypeDefs, 1061u);
    std::map<uint32_t, int> kinds;
    int flagSets = 0, unordered = 0;
    std::set<std::string> open;
    for (uint32_t i = 0; i < kelMaxTypeDefs; ++i) {
        const KelTypeDef& t = Type(i);
        ++kinds[t.kind];
        if (t.isFlagSet) {
            EXPECT_EQ(t.kind, KEL_KIND_ENUM) << t.name;
            ++flagSets;
        }
        if (t.kind == KEL_KIND_ENUM && ValuesOutOfOrder(t)) ++unordered;
        if (t.kind == KEL_KIND_ARRAY && t.size == 0) open.insert(t.name);
    }
    EXPECT_EQ(kinds[KEL_KIND_SCALAR], 88);
    EXPECT_EQ(kinds[KEL_KIND_ARRAY], 311);
    EXPECT_EQ(kinds[KEL_KIND_STRUCT], 526);
    EXPECT_EQ(kinds[KEL_KIND_ENUM], 136);
    EXPECT_EQ(kinds.size(), 4u);
    EXPECT_EQ(flagSets, 29);
    EXPECT_EQ(unordered, 4);
    EXPECT_EQ(open, (std::set<std::string>{"KEL_HistogramGenericBucketArray", "NetKel_DummyString"}));
}

TEST(SchemaTypes, NamesAreUniqueAndEveryTextIsSet) {
    std::set<std::string> names, elementNames;
    for (uint32_t i = 0; i < kelMaxTypeDefs; ++i) {
        const KelTypeDef& t = Type(i);
        ASSERT_NE(t.name, nullptr) << i;
        EXPECT_TRUE(names.insert(t.name).second) << t.name;
        if (t.kind == KEL_KIND_ARRAY) {
            EXPECT_EQ(t.format, nullptr) << t.name;
        } else {
            ASSERT_NE(t.format, nullptr) << t.name;
        }
        if (t.kind == KEL_KIND_SCALAR) {
            EXPECT_NE(t.format[0], '\0') << t.name;
            EXPECT_TRUE(t.size == 1 || t.size == 2 || t.size == 4 || t.size == 8) << t.name;
            EXPECT_EQ(t.elemTypeOrCount.count, 0u) << t.name;
            EXPECT_EQ(t.elemIndexOrTable.index, 0u) << t.name;
        }
        if (t.kind == KEL_KIND_ENUM) {
            for (uintptr_t k = 0; k < t.elemTypeOrCount.count; ++k) {
                const KelEnumElement& e = t.elemIndexOrTable.elements[k];
                ASSERT_NE(e.name, nullptr) << t.name;
                ASSERT_NE(e.text, nullptr) << e.name;
                EXPECT_TRUE(elementNames.insert(e.name).second) << e.name;
            }
        }
    }
}

TEST(SchemaTypes, ArraysAreWholeMultiplesOfTheirElement) {
    for (uint32_t i = 0; i < kelMaxTypeDefs; ++i) {
        const KelTypeDef& t = Type(i);
        if (t.kind != KEL_KIND_ARRAY) continue;
        uintptr_t elem = t.elemIndexOrTable.index;
        ASSERT_LT(elem, kelMaxTypeDefs) << t.name;
        EXPECT_EQ(t.elemTypeOrCount.elemType, kelTypeDefsLookupTab + elem) << t.name;
        ASSERT_GT(Type(elem).size, 0u) << t.name;
        EXPECT_EQ(t.size % Type(elem).size, 0u) << t.name;
    }
    // Character strings are arrays of KEL_STRING, one byte per character.
    const KelTypeDef& devName = Type(767);
    EXPECT_STREQ(devName.name, "VSCSIKel_DevName");
    EXPECT_EQ(devName.kind, KEL_KIND_ARRAY);
    EXPECT_EQ(devName.size, 16u);
    EXPECT_EQ(devName.elemIndexOrTable.index, 0u);
}

TEST(SchemaTypes, MembersAscendWithoutOverlapInsideTheirStructure) {
    for (uint32_t i = 0; i < kelMaxTypeDefs; ++i) {
        const KelTypeDef& t = Type(i);
        if (t.kind != KEL_KIND_STRUCT) continue;
        ASSERT_NE(t.elemIndexOrTable.fields, nullptr) << t.name;
        uint32_t end = 0;
        for (uintptr_t k = 0; k < t.elemTypeOrCount.count; ++k) {
            const KelField& f = t.elemIndexOrTable.fields[k];
            ASSERT_NE(f.name, nullptr) << t.name;
            ASSERT_NE(f.description, nullptr) << t.name << "." << f.name;
            ASSERT_LT(f.type, kelMaxTypeDefs) << t.name << "." << f.name;
            EXPECT_EQ(f.typeDef, kelTypeDefsLookupTab + f.type) << t.name << "." << f.name;
            if (k > 0) {
                EXPECT_GT(f.offset, t.elemIndexOrTable.fields[k - 1].offset) << t.name;
            }
            EXPECT_GE(f.offset, end) << t.name << "." << f.name << " overlaps";
            end = f.offset + f.typeDef->size;
            EXPECT_LE(end, t.size) << t.name << "." << f.name << " ends past the structure";
            EXPECT_EQ(f.offset % X86Alignment(*f.typeDef), 0u) << t.name << "." << f.name;
        }
    }
}

TEST(SchemaTypes, EnumerationsAreFourBytesAndFlagSetsSingleBits) {
    for (uint32_t i = 0; i < kelMaxTypeDefs; ++i) {
        const KelTypeDef& t = Type(i);
        if (t.kind != KEL_KIND_ENUM) continue;
        EXPECT_EQ(t.size, 4u) << t.name;
        ASSERT_NE(t.elemIndexOrTable.elements, nullptr) << t.name;
        EXPECT_GT(t.elemTypeOrCount.count, 0u) << t.name;
        if (!t.isFlagSet) continue;
        for (uintptr_t k = 0; k < t.elemTypeOrCount.count; ++k) {
            int32_t v = t.elemIndexOrTable.elements[k].value;
            EXPECT_TRUE(v >= 0 && (v & (v - 1)) == 0) << t.name << " " << v;
        }
    }
}

TEST(SchemaTypes, EmptyStructuresHaveNoMembers) {
    for (int32_t i : {14, 15}) {
        const KelTypeDef& t = Type(i);
        EXPECT_EQ(t.kind, KEL_KIND_STRUCT);
        EXPECT_EQ(t.size, 0u);
        EXPECT_EQ(t.elemTypeOrCount.count, 0u);
    }
    EXPECT_STREQ(Type(14).name, "KEL_Empty_Output");
    EXPECT_STREQ(Type(14).format, "Empty output data");
    EXPECT_EQ(Type(14).elemIndexOrTable.fields, KEL_Empty_OutputFields);
    EXPECT_STREQ(Type(15).name, "KEL_Empty_Input");
    EXPECT_STREQ(Type(15).format, "Empty input data");
    EXPECT_EQ(Type(15).elemIndexOrTable.fields, KEL_Empty_InputFields);
}

TEST(SchemaTypes, BasicTypesAndCompatibilityRecord) {
    struct Row {
        const char* name;
        uint32_t kind;
        uint32_t size;
        const char* format;
    };
    const Row rows[] = {
        {"KEL_STRING", 0, 1, "%s"},     {"KEL_CHAR_U8", 0, 1, "%c"},   {"KEL_BOOL", 0, 1, "%u"},
        {"KEL_DEC_U8", 0, 1, "%u"},     {"KEL_HEX_U8", 0, 1, "0x%02x "}, {"KEL_DEC_S16", 0, 2, "%d"},
        {"KEL_DEC_U16", 0, 2, "%u"},    {"KEL_HEX_U16", 0, 2, "0x%04x"}, {"KEL_DEC_S32", 0, 4, "%d"},
        {"KEL_DEC_U32", 0, 4, "%u"},    {"KEL_HEX_U32", 0, 4, "0x%08x"}, {"KEL_DEC_S64", 0, 8, "%Ld"},
        {"KEL_DEC_U64", 0, 8, "%Lu"},   {"KEL_HEX_U64", 0, 8, "0x%Lx"},
        {"KEL_Empty_Output", 2, 0, "Empty output data"}, {"KEL_Empty_Input", 2, 0, "Empty input data"},
        {"KEL_TIME_UNIT", 3, 4, "Time unit"}, {"KEL_KILOBYTE", 0, 8, "%Lu KB"},
        {"KEL_MEGABYTE", 0, 4, "%u MB"}, {"KEL_GIGABYTE", 0, 4, "%u GB"}, {"KEL_VA", 0, 8, "%#x"},
    };
    for (int32_t i = 0; i < 21; ++i) {
        EXPECT_STREQ(Type(i).name, rows[i].name) << i;
        EXPECT_EQ(Type(i).kind, rows[i].kind) << i;
        EXPECT_EQ(Type(i).size, rows[i].size) << i;
        EXPECT_STREQ(Type(i).format, rows[i].format) << i;
    }
    const char* units[][2] = {{"KelTime_Seconds", "s"}, {"KelTime_Milliseconds", "ms"},
                              {"KelTime_Microseconds", "us"}, {"KelTime_Nanoseconds", "ns"},
                              {"KelTime_TimerCycles", "tc"}};
    ASSERT_EQ(Type(16).elemTypeOrCount.count, 5u);
    ASSERT_EQ(Type(16).elemIndexOrTable.elements, KEL_TIME_UNITElements);
    for (int k = 0; k < 5; ++k) {
        EXPECT_STREQ(KEL_TIME_UNITElements[k].name, units[k][0]);
        EXPECT_EQ(KEL_TIME_UNITElements[k].value, k);
        EXPECT_STREQ(KEL_TIME_UNITElements[k].text, units[k][1]);
    }

    const KelTypeDef& hashes = Type(21);
    EXPECT_STREQ(hashes.name, "KELCompatHashArray");
    EXPECT_EQ(hashes.size, 2048u * 8u);
    EXPECT_EQ(hashes.elemIndexOrTable.index, 12u);  // KEL_DEC_U64
    const KelTypeDef& compat = Type(22);
    EXPECT_STREQ(compat.name, "KELCompatData");
    EXPECT_EQ(compat.size, 16388u);
    EXPECT_STREQ(compat.format, "kel version compatibility data");
    ASSERT_EQ(compat.elemTypeOrCount.count, 2u);
    EXPECT_STREQ(KELCompatDataFields[0].name, "hashes");
    EXPECT_EQ(KELCompatDataFields[0].type, 21u);
    EXPECT_EQ(KELCompatDataFields[0].offset, 0u);
    EXPECT_STREQ(KELCompatDataFields[0].description, "node hashes");
    EXPECT_STREQ(KELCompatDataFields[1].name, "numNodes");
    EXPECT_EQ(KELCompatDataFields[1].type, 9u);
    EXPECT_EQ(KELCompatDataFields[1].offset, 16384u);
    EXPECT_STREQ(KELCompatDataFields[1].description, "num nodes");
    EXPECT_EQ(Node(1).outputType, 22);

    int32_t handle = TypeIndex("ScsiKelHandleID");
    ASSERT_GE(handle, 0);
    EXPECT_EQ(Type(handle).kind, KEL_KIND_SCALAR);
    EXPECT_EQ(Type(handle).size, 8u);
    EXPECT_STREQ(Type(handle).format, "%Lu ");
}

TEST(SchemaTypes, StatSetRecordTypes) {
    const KelTypeDef& stat = Type(991);
    EXPECT_STREQ(stat.name, "StatsRegistry_Stat");
    EXPECT_EQ(stat.size, 16u);
    ASSERT_EQ(stat.elemTypeOrCount.count, 2u);
    EXPECT_STREQ(StatsRegistry_StatFields[0].name, "id");
    EXPECT_EQ(StatsRegistry_StatFields[0].type, 12u);
    EXPECT_STREQ(StatsRegistry_StatFields[0].description, "stat id");
    EXPECT_STREQ(StatsRegistry_StatFields[1].name, "value");
    EXPECT_EQ(StatsRegistry_StatFields[1].type, 11u);
    EXPECT_EQ(StatsRegistry_StatFields[1].offset, 8u);
    EXPECT_STREQ(StatsRegistry_StatFields[1].description, "stat value");
    for (uint32_t n = 1; n <= 25; ++n) {
        const KelTypeDef& array = Type(990 + 2 * n);
        const KelTypeDef& set = Type(991 + 2 * n);
        EXPECT_EQ(std::string(array.name), "StatsRegistry_GetArray" + std::to_string(n));
        EXPECT_EQ(array.kind, KEL_KIND_ARRAY);
        EXPECT_EQ(array.elemIndexOrTable.index, 991u);
        EXPECT_EQ(array.size, 16 * n);
        EXPECT_EQ(std::string(set.name), "StatsRegistry_GetStruct" + std::to_string(n));
        EXPECT_EQ(set.kind, KEL_KIND_STRUCT);
        EXPECT_EQ(set.size, 4 + 16 * n);
        EXPECT_EQ(std::string(set.format), "StatSet get struct " + std::to_string(n));
        ASSERT_EQ(set.elemTypeOrCount.count, 2u);
        const KelField* f = set.elemIndexOrTable.fields;
        EXPECT_STREQ(f[0].name, "numStats");
        EXPECT_EQ(f[0].type, 9u);
        EXPECT_EQ(f[0].offset, 0u);
        EXPECT_STREQ(f[0].description, "number of stats");
        EXPECT_STREQ(f[1].name, "stats");
        EXPECT_EQ(f[1].type, 990 + 2 * n);
        EXPECT_EQ(f[1].offset, 4u);
        EXPECT_STREQ(f[1].description, "stats");
    }
    EXPECT_EQ(StatsRegistry_GetStruct7Fields[1].typeDef->size, 112u);
}

TEST(SchemaTypes, StatMetadataRecordTypes) {
    EXPECT_STREQ(Type(1042).name, "StatsRegistry_String64");
    EXPECT_EQ(Type(1042).size, 64u);
    EXPECT_STREQ(Type(1043).name, "StatsRegistry_String128");
    EXPECT_EQ(Type(1043).size, 128u);
    EXPECT_STREQ(Type(1046).name, "StatsRegistry_Attributes");
    EXPECT_EQ(Type(1046).size, 160u);
    EXPECT_EQ(Type(1046).elemIndexOrTable.index, 1045u);

    struct Member {
        const char* name;
        uint32_t type;
        uint32_t offset;
    };
    const Member attribute[] = {{"idMapType", 990, 0}, {"type", 1044, 4}, {"name", 1042, 8},
                                {"allowWildCard", 12, 72}};
    const Member metadata[] = {{"name", 1042, 0},          {"objectType", 984, 64},
                               {"transformType", 985, 68}, {"valueType", 986, 72},
                               {"unit", 987, 76},          {"rollupType", 988, 80},
                               {"statOptions", 12, 84},    {"label", 1042, 92},
                               {"description", 1043, 156}, {"localization", 1043, 284},
                               {"attributes", 1046, 412}};
    auto check = [](int32_t index, const char* name, uint32_t size, const char* text,
                    const Member* members, uint32_t count) {
        const KelTypeDef& t = Type(index);
        EXPECT_STREQ(t.name, name);
        EXPECT_EQ(t.size, size);
        EXPECT_STREQ(t.format, text);
        ASSERT_EQ(t.elemTypeOrCount.count, count);
        for (uint32_t k = 0; k < count; ++k) {
            const KelField& f = t.elemIndexOrTable.fields[k];
            EXPECT_STREQ(f.name, members[k].name);
            EXPECT_EQ(f.type, members[k].type) << f.name;
            EXPECT_EQ(f.offset, members[k].offset) << f.name;
            EXPECT_STREQ(f.description, f.name);
        }
    };
    check(1045, "StatsRegistry_Attribute", 80, "attribute", attribute, 4);
    check(1047, "StatsRegistry_Metadata", 572, "metadata", metadata, 11);
    EXPECT_EQ(Type(1047).elemIndexOrTable.fields, StatsRegistry_MetadataFields);
}

// The stat enumerations carry the codes the catalogue stores: compare them with the catalogue's
// own enumerators, name by name.
TEST(SchemaTypes, StatEnumerationsMatchTheCatalogueCodes) {
    using namespace StatsRegistry;
    const std::map<std::string, int32_t> codes = {
        {"SR_OBJECTTYPE_VIRTUALMACHINE", SR_OBJECTTYPE_VIRTUALMACHINE},
        {"SR_OBJECTTYPE_VIRTUALCPU", SR_OBJECTTYPE_VIRTUALCPU},
        {"SR_OBJECTTYPE_VIRTUALNIC", SR_OBJECTTYPE_VIRTUALNIC},
        {"SR_OBJECTTYPE_VIRTUALDISK", SR_OBJECTTYPE_VIRTUALDISK},
        {"SR_OBJECTTYPE_VM_LUN", SR_OBJECTTYPE_VM_LUN},
        {"SR_OBJECTTYPE_HOST", SR_OBJECTTYPE_HOST},
        {"SR_OBJECTTYPE_PHYSICALCPU", SR_OBJECTTYPE_PHYSICALCPU},
        {"SR_OBJECTTYPE_PHYSICALNIC", SR_OBJECTTYPE_PHYSICALNIC},
        {"SR_OBJECTTYPE_STORAGEADAPTER", SR_OBJECTTYPE_STORAGEADAPTER},
        {"SR_OBJECTTYPE_STORAGEPATH", SR_OBJECTTYPE_STORAGEPATH},
        {"SR_OBJECTTYPE_HOST_LUN", SR_OBJECTTYPE_HOST_LUN},
        {"SR_OBJECTTYPE_DATASTORE", SR_OBJECTTYPE_DATASTORE},
        {"SR_OBJECTTYPE_LUN", SR_OBJECTTYPE_LUN},
        {"SR_TRANSFORMTYPE_NONE", SR_TRANSFORMTYPE_NONE},
        {"SR_TRANSFORMTYPE_DELTA", SR_TRANSFORMTYPE_DELTA},
        {"SR_TRANSFORMTYPE_RATE", SR_TRANSFORMTYPE_RATE},
        {"SR_VALUETYPE_ABSOLUTE", SR_VALUETYPE_ABSOLUTE},
        {"SR_VALUETYPE_DELTA", SR_VALUETYPE_DELTA},
        {"SR_VALUETYPE_RATE", SR_VALUETYPE_RATE},
        {"SR_UNIT_PERCENT", SR_UNIT_PERCENT},
        {"SR_UNIT_KILOBYTE", SR_UNIT_KILOBYTE},
        {"SR_UNIT_MEGABYTE", SR_UNIT_MEGABYTE},
        {"SR_UNIT_MEGAHERTZ", SR_UNIT_MEGAHERTZ},
        {"SR_UNIT_NUMBER", SR_UNIT_NUMBER},
        {"SR_UNIT_MICROSECOND", SR_UNIT_MICROSECOND},
        {"SR_UNIT_MILLISECOND", SR_UNIT_MILLISECOND},
        {"SR_UNIT_SECOND", SR_UNIT_SECOND},
        {"SR_UNIT_KILOBYTEPERSECOND", SR_UNIT_KILOBYTEPERSECOND},
        {"SR_UNIT_MEGABYTEPERSECOND", SR_UNIT_MEGABYTEPERSECOND},
        {"SR_UNIT_WATT", SR_UNIT_WATT},
        {"SR_UNIT_JOULE", SR_UNIT_JOULE},
        {"SR_ROLLUP_NONE", SR_ROLLUP_NONE},
        {"SR_ROLLUP_AVERAGE", SR_ROLLUP_AVERAGE},
        {"SR_ROLLUP_MAX", SR_ROLLUP_MAX},
        {"SR_ROLLUP_MIN", SR_ROLLUP_MIN},
        {"SR_ROLLUP_LATEST", SR_ROLLUP_LATEST},
        {"SR_ROLLUP_SUMMATION", SR_ROLLUP_SUMMATION},
        {"SR_STATOPTIONS_INVALID", SR_STATOPTIONS_INVALID},
        {"SR_STATOPTIONS_HIDDEN", SR_STATOPTIONS_HIDDEN},
        {"SR_IDMAPTYPE_IDENTITY", SR_IDMAPTYPE_IDENTITY},
        {"SR_IDMAPTYPE_VM_MOID_TO_WORLDID", SR_IDMAPTYPE_VM_MOID_TO_WORLDID},
        {"SR_IDMAPTYPE_VM_MOID_TO_WORLDGROUPID", SR_IDMAPTYPE_VM_MOID_TO_WORLDGROUPID},
        {"SR_IDMAPTYPE_VM_MOID", SR_IDMAPTYPE_VM_MOID},
        {"SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE", SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE},
        {"SR_IDMAPTYPE_VNIC_TO_PORT_ID", SR_IDMAPTYPE_VNIC_TO_PORT_ID},
        {"SR_PARAMTYPE_INT", SR_PARAMTYPE_INT},
        {"SR_PARAMTYPE_STRING", SR_PARAMTYPE_STRING},
    };
    struct Enum {
        int32_t index;
        const char* name;
        const char* description;
        uintptr_t count;
    };
    const Enum enums[] = {{984, "SRStatObjectType", "Object Type", 13},
                          {985, "SRStatTransformType", "Transform Type", 3},
                          {986, "SRStatValueType", "Value Type", 3},
                          {987, "SRStatUnit", "Unit", 12},
                          {988, "SRStatRollupType", "Rollup Type", 6},
                          {989, "SRStatOptions", "Stat Options", 2},
                          {990, "SRStatIdMappingType", "Id mapping type", 6},
                          {1044, "SRStatParamType", "Param type", 2}};
    size_t matched = 0;
    for (const Enum& e : enums) {
        const KelTypeDef& t = Type(e.index);
        EXPECT_STREQ(t.name, e.name);
        EXPECT_STREQ(t.format, e.description);
        EXPECT_EQ(t.isFlagSet, 0u) << e.name;
        ASSERT_EQ(t.elemTypeOrCount.count, e.count) << e.name;
        for (uintptr_t k = 0; k < e.count; ++k) {
            const KelEnumElement& el = t.elemIndexOrTable.elements[k];
            EXPECT_EQ(el.value, static_cast<int32_t>(k)) << el.name;
            auto code = codes.find(el.name);
            if (code == codes.end()) continue;
            EXPECT_EQ(el.value, code->second) << el.name;
            ++matched;
        }
    }
    EXPECT_EQ(matched, codes.size());
    EXPECT_EQ(SRStatObjectTypeElements, Type(984).elemIndexOrTable.elements);
    EXPECT_STREQ(SRStatObjectTypeElements[4].text, "vmLUN");
    EXPECT_STREQ(SRStatObjectTypeElements[12].text, "LUN");
    EXPECT_STREQ(SRStatParamTypeElements[1].text, "string");
    EXPECT_STREQ(SRStatParamTypeElements[1].name, "SR_PARAMTYPE_STRING");
    EXPECT_STREQ(SRStatIdMappingTypeElements[4].name, "SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE");
    EXPECT_STREQ(SRStatIdMappingTypeElements[4].text, "vDisk to vScsi handle");
    EXPECT_STREQ(SRStatOptionsElements[0].text, "no flags");
    EXPECT_STREQ(SRStatUnitElements[9].text, "megaBytesPerSecond");
}

}  // namespace
