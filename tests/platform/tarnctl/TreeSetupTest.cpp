// The set-up API and installation: what a test may put into the tree, and binding to it.
#include <stdexcept>

#include "TestTree.h"

namespace {

using namespace TarnCtlTest;
using TarnCtl::Sim::Tree;
using TarnCtl::Util::Sysinfo;

class SimTreeSetup : public ::testing::Test {
protected:
    Tree tree_{TestNodes()};
};

TEST_F(SimTreeSetup, AddInstanceChecksNodePathAndKind) {
    Tree& t = tree_;
    t.AddInstance(kGroups, {}, IntKey(100));
    ExpectHas(InvalidText([&] { t.AddInstance(kNodeCount, {}, IntKey(1)); }), {"node 20", "out of range"});
    ExpectHas(InvalidText([&] { t.AddInstance(kStats, {}, IntKey(1)); }),
              {"AddInstance", "node 4 \"stats\"", "not an instance node"});
    ExpectHas(InvalidText([&] { t.AddInstance(kDevices, {}, IntKey(1)); }),
              {"node 2 \"devices\"", "path []", "takes 1 instance key, 0 given"});
    ExpectHas(InvalidText([&] { t.AddInstance(kDevices, {StrKey("100")}, IntKey(1)); }),
              {"path [\"100\"]", "key 0", "string", "node 1 \"groups\"", "integer"});
    ExpectHas(InvalidText([&] { t.AddInstance(kDevices, {IntKey(101)}, IntKey(1)); }),
              {"path [101]", "key 0 (101) names no instance of node 1 \"groups\""});
    ExpectHas(InvalidText([&] { t.AddInstance(kGroups, {}, StrKey("a")); }),
              {"node 1 \"groups\"", "new key \"a\"", "takes integer keys"});
}

TEST_F(SimTreeSetup, RecordsNeedALeafAndAnExistingFullPath) {
    Tree& t = tree_;
    t.AddInstance(kGroups, {}, IntKey(100));
    t.AddInstance(kDevices, {IntKey(100)}, IntKey(7));
    t.AddInstance(kArg1, {}, IntKey(5));
    ExpectHas(InvalidText([&] { t.SetRecord(kDevices, {IntKey(100)}, {}); }),
              {"SetRecord", "node 2 \"devices\"", "not a leaf"});
    ExpectHas(InvalidText([&] { t.SetRecord(kName, {IntKey(100)}, {}); }), {"takes 2 instance keys, 1 given"});
    ExpectHas(InvalidText([&] { t.SetRecord(kName, {IntKey(100), IntKey(8)}, {}); }),
              {"path [100, 8]", "key 1 (8) names no instance of node 2 \"devices\" below [100]"});
    // An instance leaf's own key must name one of its instances too.
    ExpectHas(InvalidText([&] { t.SetRecord(kArg2, {IntKey(5), StrKey("naa.9")}, {}); }),
              {"key 1 (\"naa.9\") names no instance of node 6 \"arg2\""});
    ExpectHas(InvalidText([&] { t.RemoveRecord(kName, {IntKey(100), StrKey("7")}); }),
              {"RemoveRecord", "key 1", "string"});
    ExpectHas(InvalidText([&] { t.SetRecord(kNodeCount + 5, {}, {}); }), {"node 25", "out of range"});
}

TEST(SimTreeInstall, BindNeedsAnInstalledTreeAndANodeInRange) {
    TarnCtl::Sim::Install(nullptr);
    EXPECT_EQ(TarnCtl::Sim::Installed(), nullptr);
    ExpectHas(KeelText([] { Sysinfo s(3); }), {"Bind", "node 3", "no sysinfo tree installed"});

    auto tree = std::make_shared<Tree>(TestNodes());
    TarnCtl::Sim::Install(tree);
    EXPECT_EQ(TarnCtl::Sim::Installed(), tree);
    ExpectHas(KeelText([] { Sysinfo s(kNodeCount); }), {"Bind", "node 20", "out of range", "20 nodes"});
    ExpectHas(KeelText([] { Sysinfo s(0xffffffffu); }), {"node 4294967295", "out of range"});
    EXPECT_NO_THROW(Sysinfo s(kNodeCount - 1));

    TarnCtl::Sim::Install(nullptr);
    EXPECT_THROW(Sysinfo s(0), Keel::Lib::KeelException);
}

// An accessor keeps reading the tree it was bound to, even when another tree is installed.
TEST(SimTreeInstall, AccessorKeepsItsTree) {
    auto first = std::make_shared<Tree>(TestNodes());
    auto second = std::make_shared<Tree>(TestNodes());
    first->SetRecord(kHostSet, {}, Bytes(20, 1));
    second->SetRecord(kHostSet, {}, Bytes(20, 2));
    TarnCtl::Sim::Install(first);
    Sysinfo bound(kHostSet);
    TarnCtl::Sim::Install(second);
    uint8_t buf[20] = {};
    bound.Get(buf, sizeof buf);
    EXPECT_EQ(buf[0], 1);
    Sysinfo fresh(kHostSet);
    fresh.Get(buf, sizeof buf);
    EXPECT_EQ(buf[0], 2);
    EXPECT_EQ(first->NodeCounters(kHostSet).gets, 1u);
    EXPECT_EQ(second->NodeCounters(kHostSet).gets, 1u);
    TarnCtl::Sim::Install(nullptr);
}

using SimTreeRecords = TreeTest;

TEST_F(SimTreeRecords, SetReplacesAndRemoveDeletes) {
    uint8_t buf[20] = {};
    tree_->SetRecord(kHostSet, {}, Bytes(20, 0x99));
    Sysinfo(kHostSet).Get(buf, sizeof buf);
    EXPECT_EQ(buf[19], 0x99);

    tree_->RemoveRecord(kHostSet, {});
    ExpectHas(KeelText([&] { Sysinfo(kHostSet).Get(buf, sizeof buf); }),
              {"Get of sysinfo node 7 \"hostSet\" with path []", "no record stored"});
    EXPECT_NO_THROW(tree_->RemoveRecord(kHostSet, {}));  // removing again does nothing

    // A duplicate instance changes nothing: it is listed once, in its first place.
    tree_->AddInstance(kDevices, {IntKey(100)}, IntKey(7));
    std::vector<unsigned long long> devices;
    Sysinfo s(kDevices);
    s.AddInstancePath(100ULL);
    s.List(devices);
    EXPECT_EQ(devices, (std::vector<unsigned long long>{7, 8, 3}));
}

}  // namespace
