#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <stdexcept>

#include "StatsFixture.h"
#include "tarnstats/StatCatalogue.h"
#include "retrieval/UniqueStatKelPath.h"

namespace {

using StatsRegistry::StatInstance;
using StatsRegistry::StatInstanceValue;
using TarnCtl::Sim::Fault;
using TarnCtl::Sim::IntKey;
using TarnCtl::Sim::Op;
using TarnCtl::Sim::StrKey;
using Strings = std::vector<std::string>;

struct Result {
    long statId;
    Strings instances;
    int64_t value;
    bool operator==(const Result& o) const { return statId == o.statId && instances == o.instances && value == o.value; }
    bool operator<(const Result& o) const {
        return std::tie(statId, instances, value) < std::tie(o.statId, o.instances, o.value);
    }
};

void PrintTo(const Result& r, std::ostream* os) {
    *os << r.statId << " [";
    for (const auto& s : r.instances) *os << '"' << s << "\" ";
    *os << "] = " << r.value;
}

class GetStatValues : public TestSupport::StatsFixture {
protected:
    void SetUp() override {
        StatsFixture::SetUp();
        Install(HostSim::SampleHost());
    }
    void Ask(long statId, Strings instances) { requests.Append(new StatInstance(statId, std::move(instances))); }
    std::vector<Result> Run() {
        values.clear();
        stats->GetStatValues(requests, values);
        return Collected();
    }
    std::vector<Result> Collected() const {
        std::vector<Result> out;
        for (const auto& v : values) out.push_back({v->statInstance->statId, v->statInstance->attrInstances, v->value});
        return out;
    }
    // What the host holds for a stat, as results (level-0 VM moid text given for vNIC stats).
    std::vector<Result> Expected(long statId, const std::string& moid = "*") const {
        std::vector<Result> out;
        for (auto& inst : HostSim::StatInstances(host, statId, moid)) {
            out.push_back({statId, inst, HostSim::ValueOf(host, statId, inst)});
        }
        return out;
    }
    const HostSim::Vm& Vm(size_t i) const { return host.vms[i]; }
    static std::string Text(uint64_t n) { return std::to_string(n); }

    Plinth::RefVector<StatInstance> requests;
    Plinth::RefVector<StatInstanceValue> values;
};

TEST_F(GetStatValues, VirtualDiskByWorldAndDeviceName) {
    const auto& vm = Vm(2);
    Ask(7, {Text(vm.worldGroupId), vm.disks[1].name});
    const Strings instances{Text(vm.worldGroupId), vm.disks[1].name};
    EXPECT_EQ(Run(), (std::vector<Result>{{7, instances, HostSim::ValueOf(host, 7, instances)}}));
    EXPECT_EQ(tree->NodeCounters(1580).gets, 1u);
    EXPECT_EQ(tree->NodeCounters(1314).lists, 1u);
    EXPECT_TRUE(Warnings().empty());
}

TEST_F(GetStatValues, VirtualDiskWildcardsNeedNoNameLookup) {
    Ask(7, {"*", "*"});
    EXPECT_EQ(Run(), Expected(7));  // depth first, in listing order
    EXPECT_EQ(tree->NodeCounters(1314).lists, 0u);
    size_t disks = 0;
    for (const auto& vm : host.vms) disks += vm.disks.size();
    EXPECT_EQ(tree->NodeCounters(1580).gets, disks);
    EXPECT_EQ(tree->NodeCounters(1315).gets, disks);  // one name read per result path
}

TEST_F(GetStatValues, NamedDiskInEveryWorld) {
    const auto& vm = Vm(0);
    Ask(9, {"*", vm.disks[0].name});
    const Strings instances{Text(vm.worldGroupId), vm.disks[0].name};
    EXPECT_EQ(Run(), (std::vector<Result>{{9, instances, HostSim::ValueOf(host, 9, instances)}}));
    // Every other world lacks the disk: logged, and the walk goes on.
    const auto warnings = Warnings();
    ASSERT_EQ(warnings.size(), host.vms.size() - 1);
    EXPECT_EQ(warnings[0], "failed to get vscsi id for (" + Text(Vm(1).worldGroupId) + ":" + vm.disks[0].name + ")");
}

TEST_F(GetStatValues, OneReadPerNodeAndInstancePath) {
    Ask(3, {});
    Ask(4, {});
    Ask(3, {});
    EXPECT_EQ(Run().size(), 2u);
    EXPECT_EQ(tree->NodeCounters(1569).gets, 1u);

    tree->ResetCounters();
    requests.clear();
    const std::string world = Text(Vm(1).worldId);
    Ask(41, {world});
    Ask(41, {"*"});
    Ask(42, {world});
    const auto results = Run();
    // The concrete and the wildcard requests are two groups: the path of world 1 is read twice.
    EXPECT_EQ(tree->NodeCounters(1654).gets, 1u + host.vms.size());
    EXPECT_EQ(std::count_if(results.begin(), results.end(),
                            [&](const Result& r) { return r.statId == 41 && r.instances[0] == world; }),
              2);
}

TEST_F(GetStatValues, GroupsComeInKeyOrderAfterEarlierResults) {
    values.Append(new StatInstanceValue);
    Ask(69, {Text(Vm(0).worldId)});
    Ask(0, {"*", "*"});
    stats->GetStatValues(requests, values);
    ASSERT_GE(values.size(), 3u);
    EXPECT_FALSE(values[0]->statInstance);  // the earlier entry stays first
    EXPECT_EQ(values[1]->statInstance->statId, 0);
    EXPECT_EQ(values.back()->statInstance->statId, 69);
    for (size_t i = 1; i < values.size(); ++i) {
        for (const auto& s : values[i]->statInstance->attrInstances) EXPECT_NE(s, "*");
    }
}

TEST_F(GetStatValues, EveryStatWithWildcardsCoversTheHost) {
    std::vector<Result> expected;
    for (long id = 0; id < 70; ++id) {
        const size_t levels = StatsRegistry::KELStats::_sStatAttrIdMapType[id].size();
        Strings all(levels, "*");
        if (id == 33 || id == 34) all[0] = Vm(0).moid;  // a VM moid level cannot be listed
        Ask(id, all);
        auto e = Expected(id, all.empty() ? "*" : all[0]);
        expected.insert(expected.end(), e.begin(), e.end());
    }
    auto results = Run();
    EXPECT_TRUE(Warnings().empty()) << Warnings()[0];
    std::sort(results.begin(), results.end());
    std::sort(expected.begin(), expected.end());
    EXPECT_EQ(results, expected);
    // Each distinct path of each read node was read exactly once.
    uint64_t gets = 0;
    for (unsigned node : {1562u, 1566u, 1569u, 1573u, 1580u, 1585u, 1590u, 1598u, 1603u, 1608u, 1613u, 1619u, 1626u,
                          1630u, 1635u, 1638u, 1641u, 1644u, 1647u, 1650u, 1654u, 1659u, 1667u, 1670u, 1673u, 1678u,
                          1687u, 1693u, 1698u}) {
        gets += tree->NodeCounters(node).gets;
    }
    std::set<std::pair<unsigned, Strings>> paths;
    for (const auto& r : expected) paths.insert({statIdMap[r.statId], r.instances});
    EXPECT_EQ(gets, paths.size());
}

TEST_F(GetStatValues, WildcardTraceAndEmptyListing) {
    host.pnics.clear();
    Install(host);
    Ask(35, {"*"});
    EXPECT_TRUE(Run().empty());
    EXPECT_EQ(log.Texts(64), Strings{"attr list count 0"});
    log.SetLevels(0x80008);  // level 64 closed: no trace
    log.Clear();
    Run();
    EXPECT_TRUE(log.Entries().empty());
}

TEST_F(GetStatValues, FailingListingEndsOnlyItsBranch) {
    const auto& vm = Vm(2);
    Fault fault;
    fault.op = Op::List;
    fault.node = 1562;
    fault.anyPath = false;
    fault.path = {IntKey(vm.worldId)};
    fault.text = "gone";
    tree->AddFault(fault);
    Ask(0, {"*", "*"});
    auto expected = Expected(0);
    expected.erase(std::remove_if(expected.begin(), expected.end(),
                                  [&](const Result& r) { return r.instances[0] == Text(vm.worldId); }),
                   expected.end());
    EXPECT_EQ(Run(), expected);
    EXPECT_FALSE(expected.empty());
    EXPECT_EQ(Warnings(), (Strings{"failed to list attribute instance: gone", "stat Id: 0, index: 1, type: 1"}));
}

TEST_F(GetStatValues, ExceptionsLeaveWithEarlierResultsKept) {
    for (auto kind : {Fault::Kind::ThrowKeel, Fault::Kind::ThrowOther}) {
        requests.clear();
        values.clear();
        tree->ClearFaults();
        Fault fault;
        fault.op = Op::Bind;
        fault.node = 1698;  // stat 69, the last group
        fault.kind = kind;
        tree->AddFault(fault);
        Ask(69, {"*"});
        Ask(3, {});
        const long before = Plinth::ObjectImpl::LiveObjects();
        EXPECT_ANY_THROW(stats->GetStatValues(requests, values));
        ASSERT_EQ(values.size(), 1u);  // stat 3's group came first and keeps its result
        EXPECT_EQ(values[0]->statInstance->statId, 3);
        EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before + 2);  // that result and its instance only
    }
    // A kernel exception while the path is built is not caught either.
    tree->ClearFaults();
    Fault fault;
    fault.op = Op::AddInstancePath;
    fault.node = 1654;
    tree->AddFault(fault);
    requests.clear();
    values.clear();
    Ask(41, {Text(Vm(0).worldId)});
    EXPECT_ANY_THROW(stats->GetStatValues(requests, values));
}

TEST_F(GetStatValues, InvalidIdsAreRefusedAndTheRestServed) {
    Ask(70, {});
    Ask(-1, {"1"});
    if constexpr (sizeof(long) == 8) Ask(static_cast<long>(4294967301ll), {Text(Vm(0).worldId)});  // low bits say 5
    Ask(3, {});
    const auto results = Run();
    EXPECT_EQ(results.size(), 1u);
    EXPECT_EQ(results[0].statId, 3);
    Strings expected{"invalid statId: 70; expect [0, 70)", "invalid statId: 4294967295; expect [0, 70)"};
    if constexpr (sizeof(long) == 8) expected.push_back("invalid statId: 5; expect [0, 70)");
    EXPECT_EQ(Warnings(), expected);
}

TEST_F(GetStatValues, InstanceCountMustMatchTheAttributes) {
    Ask(5, {});                                  // shorter
    Ask(5, {Text(Vm(0).worldId), "extra"});      // longer
    Ask(5, {Text(Vm(0).worldId)});
    const auto results = Run();
    ASSERT_EQ(results.size(), 1u);
    EXPECT_EQ(Warnings(), (Strings{"request for stat 5 has 0 instances, expect 1",
                                   "request for stat 5 has 2 instances, expect 1"}));
}

TEST_F(GetStatValues, EmptyReferenceIsSkipped) {
    requests.push_back(Plinth::Ref<StatInstance>());
    Ask(3, {});
    EXPECT_EQ(Run().size(), 1u);
    EXPECT_EQ(Warnings(), Strings{"empty request reference at index 0 skipped"});
}

TEST_F(GetStatValues, LineFeedKeysStaySeparateGroups) {
    EXPECT_EQ(StatsRegistry::UniqueStatKelPath::GetUniqueKey(1562, {"100", "disk1"}), "1562\n100\ndisk1");
    EXPECT_EQ(StatsRegistry::UniqueStatKelPath::GetUniqueKey(1569, {}), "1569");
    const uint64_t world = Vm(0).worldId;
    tree->AddInstance(1562, {IntKey(world)}, StrKey("y"));
    tree->AddInstance(1562, {IntKey(world)}, StrKey("x\ny"));
    tree->SetRecord(1562, {IntKey(world), StrKey("y")}, TestSupport::Record(1, {{0, 11}}));
    tree->SetRecord(1562, {IntKey(world), StrKey("x\ny")}, TestSupport::Record(1, {{1, 22}}));
    // Both lists join to the key "1562\n<world>\nx\ny"; each is walked with its own list.
    Ask(0, {Text(world) + "\nx", "y"});
    Ask(1, {Text(world), "x\ny"});
    const auto results = Run();
    EXPECT_EQ(results, (std::vector<Result>{{0, {Text(world) + "\nx", "y"}, 11}, {1, {Text(world), "x\ny"}, 22}}));
}

TEST_F(GetStatValues, VmMoidWildcardYieldsNothing) {
    Ask(33, {"*", "*"});
    EXPECT_TRUE(Run().empty());
    ASSERT_EQ(Warnings().size(), 2u);
    EXPECT_EQ(Warnings()[1], "stat Id: 33, index: 0, type: 1");
    requests.clear();
    Ask(33, {Vm(1).moid, "*"});
    EXPECT_EQ(Run(), Expected(33, Vm(1).moid));
}

TEST_F(GetStatValues, EmptyRequestListTouchesNothing) {
    values.Append(new StatInstanceValue);
    stats->GetStatValues(requests, values);
    EXPECT_EQ(values.size(), 1u);
    EXPECT_EQ(tree->TotalCounters().binds, 0u);
    EXPECT_TRUE(log.Entries().empty());
}

}  // namespace
