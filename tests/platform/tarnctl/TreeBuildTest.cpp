// Building a tree from a node table: validation of the links and the key counts they imply.
#include <stdexcept>

#include "TestTree.h"

namespace {

using namespace TarnCtlTest;
using TarnCtl::Sim::NodeInfo;
using TarnCtl::Sim::Tree;

std::string BuildError(std::vector<NodeInfo> nodes) {
    try {
        Tree t(std::move(nodes));
    } catch (const std::invalid_argument& e) {
        return e.what();
    }
    ADD_FAILURE() << "table accepted";
    return "";
}

TEST(SimTreeBuild, RejectsBrokenTables) {
    EXPECT_NE(BuildError({}), "");
    ExpectHas(BuildError({Info("root", 1, false), Info("a", 0, false)}), {"node 0", "root"});
    ExpectHas(BuildError({Info("root", 0, false), Info("a", 2, true)}), {"node 1", "parent 2", "out of range"});
    ExpectHas(BuildError({Info("root", 0, false), Info("a", -1, true)}), {"node 1", "parent -1"});
    ExpectHas(BuildError({Info("root", 0, false), Info("leaf", 0, true), Info("b", 1, true)}),
              {"node 2", "parent 1", "leaf"});
    // 1 and 2 are each other's parents: the chain never reaches the root.
    ExpectHas(BuildError({Info("root", 0, false), Info("a", 2, false), Info("b", 1, false)}), {"cycle"});
}

// Key counts follow from the parent links alone: List takes one key per instance ancestor,
// Get one more when the node is itself an instance node. Checked against an independent walk.
TEST(SimTreeBuild, KeyCountsFollowTheInstanceAncestors) {
    const std::vector<NodeInfo> nodes = TestNodes();
    const Tree t(nodes);
    ASSERT_EQ(t.NodeCount(), nodes.size());
    for (unsigned i = 0; i < nodes.size(); ++i) {
        unsigned ancestors = 0;
        for (unsigned p = i; p != 0;) {
            p = static_cast<unsigned>(nodes[p].parent);
            ancestors += nodes[p].isInstance ? 1 : 0;
        }
        EXPECT_EQ(t.ListKeyCount(i), ancestors) << "node " << i;
        EXPECT_EQ(t.GetKeyCount(i), ancestors + (nodes[i].isInstance ? 1 : 0)) << "node " << i;
        EXPECT_EQ(t.Node(i).name, nodes[i].name);
    }
    EXPECT_EQ(t.GetKeyCount(kDeep), TarnCtl::Util::Sysinfo::kMaxPathKeys);
    EXPECT_THROW(t.Node(t.NodeCount()), std::out_of_range);
    EXPECT_THROW(t.ListKeyCount(t.NodeCount()), std::out_of_range);
    EXPECT_THROW(t.NodeCounters(t.NodeCount()), std::out_of_range);
}

// Ids need not follow tree order: a parent may have a higher id than its child.
TEST(SimTreeBuild, AcceptsParentsWithHigherIds) {
    std::vector<NodeInfo> nodes = {Info("root", 0, false), Info("leaf", 2, true, false, false, 4),
                                   Info("inst", 0, false, true, true)};
    auto t = std::make_shared<Tree>(nodes);
    EXPECT_EQ(t->GetKeyCount(1), 1u);
    t->AddInstance(2, {}, IntKey(9));
    t->SetRecord(1, {IntKey(9)}, Bytes(4, 1));
    TarnCtl::Sim::Install(t);
    TarnCtl::Util::Sysinfo s(1);
    s.AddInstancePath(9ULL);
    unsigned char buf[4] = {};
    s.Get(buf, 4);
    EXPECT_EQ(buf[3], 1);
    TarnCtl::Sim::Install(nullptr);
}

}  // namespace
