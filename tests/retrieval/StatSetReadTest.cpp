#include <gtest/gtest.h>

#include <stdexcept>

#include "StatsFixture.h"

namespace {

using TarnCtl::Sim::Fault;
using TarnCtl::Sim::IntKey;
using TarnCtl::Sim::Op;
using TarnCtl::Sim::Path;
using TarnCtl::Sim::StrKey;
using TestSupport::Record;

struct Result {
    long statId;
    std::vector<std::string> instances;
    int64_t value;
    bool operator==(const Result& o) const {
        return statId == o.statId && instances == o.instances && value == o.value;
    }
};

std::vector<Result> Results(const Plinth::RefVector<StatsRegistry::StatInstanceValue>& values) {
    std::vector<Result> out;
    for (const auto& v : values) {
        EXPECT_EQ(v->GetRefCount(), 1);
        EXPECT_EQ(v->statInstance->GetRefCount(), 1);
        out.push_back({v->statInstance->statId, v->statInstance->attrInstances, v->value});
    }
    return out;
}

class StatSetRead : public TestSupport::StatsFixture {
protected:
    void SetUp() override {
        StatsFixture::SetUp();
        UseTree(HostSim::SchemaNodes());
    }
    void UseTree(std::vector<TarnCtl::Sim::NodeInfo> nodes) {
        InstallTree(std::make_shared<TarnCtl::Sim::Tree>(std::move(nodes)));
    }
    // A virtual disk of world group 2001 with handle 8193 named "web01-disk0", and its record.
    void AddDisk(const Path& path, bool withName = true) {
        tree->AddInstance(1579, {}, path[0]);
        tree->AddInstance(1580, {path[0]}, path[1]);
        tree->SetRecord(1580, path, Record(2, {{7, 700}, {8, 800}}));
        tree->AddInstance(492, {}, IntKey(2001));
        tree->AddInstance(1314, {IntKey(2001)}, IntKey(8193));
        if (withName) {
            std::string name = "web01-disk0";
            name.resize(16, '\0');
            tree->SetRecord(1315, {IntKey(2001), IntKey(8193)}, std::vector<uint8_t>(name.begin(), name.end()));
        }
    }
    bool Read(std::set<long> ids, long statId, unsigned node, std::vector<std::string> instances) {
        return impl->RetrieveStatValues(ids, statId, node, instances, values);
    }
    Plinth::RefVector<StatsRegistry::StatInstanceValue> values;
};

TEST_F(StatSetRead, HostWideSetIsReadOnceWithoutPath) {
    tree->SetRecord(1569, {}, Record(2, {{4, -40}, {3, 30}}));
    ASSERT_TRUE(Read({3, 4}, 3, 1569, {}));
    EXPECT_EQ(Results(values), (std::vector<Result>{{4, {}, -40}, {3, {}, 30}}));  // record order
    EXPECT_EQ(tree->NodeCounters(1569).gets, 1u);
    EXPECT_EQ(tree->NodeCounters(1569).binds, 1u);
    EXPECT_TRUE(log.Entries().empty());
}

TEST_F(StatSetRead, UnwantedDuplicatedAndMissingIds) {
    tree->SetRecord(1678, {}, Record(5, {{55, 1}, {60, 2}, {55, 3}, {61, 4}, {99, 5}}));
    ASSERT_TRUE(Read({55, 57, 61}, 55, 1678, {}));
    EXPECT_EQ(Results(values), (std::vector<Result>{{55, {}, 1}, {55, {}, 3}, {61, {}, 4}}));
    EXPECT_TRUE(log.Entries().empty());
}

TEST_F(StatSetRead, EmptyRecordsYieldNothing) {
    tree->SetRecord(1569, {}, Record(0, {{3, 30}}));
    EXPECT_TRUE(Read({3}, 3, 1569, {}));
    Fault nothing;
    nothing.op = Op::Get;
    nothing.node = 1569;
    nothing.kind = Fault::Kind::CopyNothing;
    tree->SetRecord(1569, {}, Record(1, {{3, 30}}));
    tree->AddFault(nothing);
    EXPECT_TRUE(Read({3}, 3, 1569, {}));  // the zero-filled buffer reads as no entry
    EXPECT_TRUE(values.empty());
    EXPECT_TRUE(log.Entries().empty());
}

TEST_F(StatSetRead, StatWithoutSetReadsTwentyBytes) {
    tree->AddInstance(1566, {}, StrKey("lun.1"));
    // The tree refuses any size other than the node's 20-byte record, so success shows the size.
    tree->SetRecord(1566, {StrKey("lun.1")}, Record(1, {{2, 22}}));
    ASSERT_TRUE(Read({2}, 2, 1566, {"lun.1"}));
    EXPECT_EQ(Results(values), (std::vector<Result>{{2, {"lun.1"}, 22}}));
}

TEST_F(StatSetRead, CountBeyondTheBufferDecodesOnlyWhatItHolds) {
    tree->AddInstance(1566, {}, StrKey("lun.1"));
    // The kernel claims three entries and sends a longer record: only the one entry of the
    // 20-byte buffer is decoded.
    tree->SetRecord(1566, {StrKey("lun.1")}, Record(3, {{2, 22}, {2, 23}, {2, 24}}));
    ASSERT_TRUE(Read({2}, 2, 1566, {"lun.1"}));
    EXPECT_EQ(Results(values), (std::vector<Result>{{2, {"lun.1"}, 22}}));
    EXPECT_EQ(Warnings(), std::vector<std::string>{"stat set record of node 1566 counts 3 stats, room for 1"});
}

TEST_F(StatSetRead, UpperIdBitsNameNoStat) {
    tree->SetRecord(1569, {}, Record(2, {{(1ull << 32) | 3, 99}, {3, 30}}));
    ASSERT_TRUE(Read({3}, 3, 1569, {}));
    EXPECT_EQ(Results(values), (std::vector<Result>{{3, {}, 30}}));
}

TEST_F(StatSetRead, VirtualDiskResultsCarryTheDeviceName) {
    AddDisk({IntKey(2001), IntKey(8193)});
    ASSERT_TRUE(Read({7, 8}, 7, 1580, {"2001", "8193"}));
    EXPECT_EQ(Results(values), (std::vector<Result>{{7, {"2001", "web01-disk0"}, 700}, {8, {"2001", "web01-disk0"}, 800}}));
    EXPECT_EQ(tree->NodeCounters(1315).gets, 1u);
    // A handle text of digits then letters reads as the digits.
    values.clear();
    ASSERT_TRUE(Read({7}, 7, 1580, {"2001", "8193xyz"}));
    EXPECT_EQ(Results(values), (std::vector<Result>{{7, {"2001", "web01-disk0"}, 700}}));
}

TEST_F(StatSetRead, FailedNameLookupDiscardsTheRecord) {
    AddDisk({IntKey(2001), IntKey(8193)}, /*withName=*/false);
    EXPECT_FALSE(Read({7, 8}, 7, 1580, {"2001", "8193"}));
    EXPECT_TRUE(values.empty());
    ASSERT_EQ(Warnings().size(), 1u);
    EXPECT_EQ(Warnings()[0].rfind("failed to get vscsi name for (2001:8193): ", 0), 0u) << Warnings()[0];
}

TEST_F(StatSetRead, FailureRowsLogTheirMessage) {
    // Path preparation refuses the text.
    EXPECT_FALSE(Read({5}, 5, 1573, {"abc"}));
    EXPECT_EQ(Warnings(), std::vector<std::string>{"failed to convert abc to int"});
    // The read throws the kernel's exception.
    log.Clear();
    Fault fault;
    fault.op = Op::Get;
    fault.node = 1569;
    fault.text = "node busy";
    tree->SetRecord(1569, {}, Record(1, {{3, 30}}));
    tree->AddFault(fault);
    EXPECT_FALSE(Read({3}, 3, 1569, {}));
    EXPECT_EQ(log.Entries(), (std::vector<TestSupport::LogEntry>{{"KELStatsImpl", 8, "failed to get kel stat set: node busy"}}));
    // A missing record is the kernel's failure too.
    log.Clear();
    EXPECT_FALSE(Read({5}, 5, 1573, {"1001"}));
    ASSERT_EQ(Warnings().size(), 1u);
    EXPECT_EQ(Warnings()[0].rfind("failed to get kel stat set: ", 0), 0u);
    EXPECT_TRUE(values.empty());
}

TEST_F(StatSetRead, VscsiLevelWithoutVmLevelBefore) {
    AddDisk({IntKey(2001), IntKey(8193)});
    auto& codes = StatsRegistry::KELStats::_sStatAttrIdMapType[7];
    const long saved = codes[0];
    codes[0] = 0;
    const bool ok = Read({7}, 7, 1580, {"2001", "8193"});
    codes[0] = saved;
    EXPECT_FALSE(ok);
    EXPECT_TRUE(values.empty());
    EXPECT_EQ(Warnings(), std::vector<std::string>{"no VM attr before vSCSI(7:1)"});
}

// The conversions of the name mapping are reached only when the path itself took the texts, so
// these cases key the disk levels by strings.
TEST_F(StatSetRead, UnreadableWorldGroupOrHandleText) {
    auto nodes = HostSim::SchemaNodes();
    nodes[1579].isIntegerInstance = false;
    nodes[1580].isIntegerInstance = false;
    UseTree(nodes);
    auto& types = StatsRegistry::KELStats::_sStatAttrDataType[7];
    const std::vector<long> saved = types;
    types = {1, 1};
    tree->AddInstance(1579, {}, StrKey("group"));
    tree->AddInstance(1580, {StrKey("group")}, StrKey("x9"));
    tree->SetRecord(1580, {StrKey("group"), StrKey("x9")}, Record(1, {{7, 1}}));
    tree->AddInstance(1579, {}, StrKey("2001"));
    tree->AddInstance(1580, {StrKey("2001")}, StrKey("x9"));
    tree->SetRecord(1580, {StrKey("2001"), StrKey("x9")}, Record(1, {{7, 1}}));
    const bool badGroup = Read({7}, 7, 1580, {"group", "x9"});
    const bool badHandle = Read({7}, 7, 1580, {"2001", "x9"});
    types = saved;
    EXPECT_FALSE(badGroup);
    EXPECT_FALSE(badHandle);
    EXPECT_TRUE(values.empty());
    EXPECT_EQ(Warnings(), (std::vector<std::string>{"failed to convert group to int", "failed to convert id x9 to int"}));
}

TEST_F(StatSetRead, OtherExceptionsPassWithNothingLeaked) {
    const long before = Plinth::ObjectImpl::LiveObjects();
    tree->SetRecord(1569, {}, Record(2, {{3, 30}, {4, 40}}));
    Fault fault;
    fault.op = Op::Get;
    fault.node = 1569;
    fault.kind = Fault::Kind::ThrowOther;
    tree->AddFault(fault);
    EXPECT_THROW(Read({3}, 3, 1569, {}), std::runtime_error);
    tree->ClearFaults();
    fault.op = Op::Bind;
    fault.kind = Fault::Kind::ThrowKeel;
    tree->AddFault(fault);  // the accessor's own failure to bind is not caught
    EXPECT_ANY_THROW(Read({3}, 3, 1569, {}));
    EXPECT_TRUE(values.empty());
    EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before);
    EXPECT_TRUE(Warnings().empty());
}

}  // namespace
