#include <gtest/gtest.h>

#include "tarnstats/KELStats.h"
#include "tarnstats/StatRecords.h"

namespace {

using namespace StatsRegistry;

TEST(Records, AttributeCopyKeepsAllSixFields) {
    StatAttribute a("vscsi handle", "unknown type", true, -1, SR_PARAMTYPE_INT, SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE);
    std::vector<StatAttribute> list;
    list.push_back(a);
    StatAttribute b(list[0]);
    EXPECT_EQ(b.name, "vscsi handle");
    EXPECT_EQ(b.attrType, "unknown type");
    EXPECT_TRUE(b.allowWildCard);
    EXPECT_EQ(b.objectType, -1);
    EXPECT_EQ(b.dataType, 0);
    EXPECT_EQ(b.idMapType, 4);
    StatAttribute c("vm", "vm", false, 0, SR_PARAMTYPE_STRING, SR_IDMAPTYPE_VM_MOID);
    StatAttribute d(c);
    EXPECT_FALSE(d.allowWildCard);
    EXPECT_EQ(d.objectType, 0);
    EXPECT_EQ(d.dataType, 1);
    EXPECT_EQ(d.idMapType, 3);
}

TEST(Records, ResultOwnsItsInstance) {
    const long before = Plinth::ObjectImpl::LiveObjects();
    {
        Plinth::RefVector<StatInstanceValue> values;
        auto* v = new StatInstanceValue;
        values.Append(v);
        v->statInstance.Assign(new StatInstance(7, {"100", "disk1"}));
        v->value = -3;
        EXPECT_EQ(v->GetRefCount(), 1);
        EXPECT_EQ(v->statInstance->GetRefCount(), 1);
        EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before + 2);
        Plinth::RefVector<StatDef> defs;
        defs.Append(new StatDef);
        defs[0]->attributes.emplace_back("worldId", "vm", true, 0, 0, 1);
    }
    EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before);
}

TEST(StaticHelpers, CodeClassification) {
    struct Case {
        unsigned code;
        bool moidToWid, moid, vnic;
        const char* attrType;
    } cases[] = {
        {0, false, false, false, "unknown type"}, {1, true, false, false, "vm"},
        {2, true, false, false, "vm"},            {3, false, true, false, "unknown type"},
        {4, false, false, false, "unknown type"}, {5, false, false, true, "unknown type"},
        {6, false, false, false, "unknown type"}, {4294967295u, false, false, false, "unknown type"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(KELStats::IsVmMoidToWid(c.code), c.moidToWid) << c.code;
        EXPECT_EQ(KELStats::IsVmMoid(c.code), c.moid) << c.code;
        EXPECT_EQ(KELStats::IsVnicToPort(c.code), c.vnic) << c.code;
        EXPECT_EQ(KELStats::GetAttrType(c.code), c.attrType) << c.code;
    }
}

}  // namespace
