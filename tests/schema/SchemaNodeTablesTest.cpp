// Rules over the whole node table: ids, counts, the tree, record types and the fixed rows.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "SchemaTestSupport.h"

namespace {

using namespace SchemaTest;

int Depth(int32_t id) {
    int depth = 0;
    while (id != 0 && depth <= static_cast<int>(kelMaxNodes)) {
        id = Node(id).parent;
        ++depth;
    }
    return depth;
}

TEST(SchemaNodes, IdsAreIndexesAndTheCountsHold) {
    ASSERT_EQ(kelMaxNodes, 1711u);
    EXPECT_EQ(KEL_ALL_IFACE_HASH, 0x16b7e0427b0d1430ull);
    std::map<std::string, int> count;
    for (uint32_t i = 0; i < kelMaxNodes; ++i) {
        const KelNode& n = Node(i);
        EXPECT_EQ(n.id, i);
        bool branch = !n.isLeaf;
        count["leaf"] += n.isLeaf;
        count["branch"] += branch;
        count["empty"] += branch && n.child == -1;
        count["instance"] += n.isInstance;
        count["integer"] += n.isIntegerInstance;
        count["input"] += n.hasInput;
        count["untyped"] += n.isUntypedLeaf;
        count["flag4"] += n.flag4;
        count["flag5"] += n.flag5;
        count["flag7"] += n.flag7;
        count["flag7 leaf"] += n.flag7 && n.isLeaf;
        count["parent above"] += i > 0 && n.parent > static_cast<int32_t>(i);
        if (n.isIntegerInstance) {
            EXPECT_TRUE(n.isInstance) << i;
        }
        if (n.hasInput || n.isUntypedLeaf) {
            EXPECT_TRUE(n.isLeaf) << i;
        }
        if (n.flag4 || n.flag5) {
            EXPECT_TRUE(branch && n.isInstance) << i;
        }
        EXPECT_EQ(n.hasInput != 0, n.inputType != -1) << i;
    }
    EXPECT_EQ(count["leaf"], 1345);
    EXPECT_EQ(count["branch"], 366);
    EXPECT_EQ(count["empty"], 7);
    EXPECT_EQ(count["instance"], 310);
    EXPECT_EQ(count["integer"], 191);
    EXPECT_EQ(count["input"], 5);
    EXPECT_EQ(count["untyped"], 3);
    EXPECT_EQ(count["flag4"], 1);
    EXPECT_EQ(count["flag5"], 2);
    EXPECT_EQ(count["flag7"], 170);
    EXPECT_EQ(count["flag7 leaf"], 163);
    EXPECT_EQ(count["parent above"], 19);
}

// The chain from a node's child through sibling visits exactly the nodes whose parent it is,
// in strictly descending id, and ends at -1.
TEST(SchemaNodes, ChildChainsEqualTheParentRelation) {
    for (uint32_t i = 0; i < kelMaxNodes; ++i) {
        const KelNode& n = Node(i);
        std::vector<int32_t> chain;
        for (int32_t c = n.child; c != -1 && chain.size() <= kelMaxNodes; c = Node(c).sibling) {
            ASSERT_GE(c, 0) << "chain of " << i;
            ASSERT_LT(c, static_cast<int32_t>(kelMaxNodes)) << "chain of " << i;
            chain.push_back(c);
        }
        EXPECT_EQ(chain, ChildrenByParent(i)) << "children of " << i;
        if (n.isLeaf) {
            EXPECT_EQ(n.child, -1) << i;
        }
        for (int32_t c : chain) EXPECT_FALSE(Node(Node(c).parent).isLeaf) << c;
    }
    std::vector<int32_t> top;
    for (int32_t c = Node(0).child; c != -1; c = Node(c).sibling) top.push_back(c);
    ASSERT_EQ(top.size(), 23u);
    EXPECT_EQ(top.front(), 1706);
    EXPECT_STREQ(Node(1706).name, "tpm");
    EXPECT_EQ(top.back(), 1);
    EXPECT_STREQ(Node(1).name, "sysInfoNodeHashes");
}

TEST(SchemaNodes, TreeShapeNamesAndHashes) {
    const KelNode& root = Node(0);
    EXPECT_STREQ(root.name, "root");
    EXPECT_EQ(root.parent, 0);
    EXPECT_EQ(root.sibling, -1);
    int maxDepth = 0;
    size_t longest = 0;
    std::set<uint64_t> hashes;
    for (uint32_t i = 0; i < kelMaxNodes; ++i) {
        const KelNode& n = Node(i);
        ASSERT_NE(n.name, nullptr) << i;
        if (i > 0) {
            EXPECT_NE(n.parent, static_cast<int32_t>(i));
        }
        int depth = Depth(i);
        ASSERT_LE(depth, 7) << "node " << i << " is more than 7 levels down or off the tree";
        maxDepth = std::max(maxDepth, depth);
        longest = std::max(longest, std::string(n.name).size());
        uint64_t hash = n.hash;
        EXPECT_TRUE(hashes.insert(hash).second) << "hash of " << i;
        std::set<std::string> names;
        for (int32_t c : ChildrenByParent(i)) {
            EXPECT_TRUE(names.insert(Node(c).name).second) << Node(c).name << " under " << i;
        }
    }
    EXPECT_EQ(maxDepth, 7);
    EXPECT_EQ(longest, 42u);
}

void ExpectSlot(uint32_t id, const char* what, int32_t type, uint32_t size,
                const KelTypeDef* def) {
    if (type == -1) {
        EXPECT_EQ(def, nullptr) << what << " of " << id;
        EXPECT_EQ(size, 0u) << what << " of " << id;
        return;
    }
    ASSERT_GE(type, 0) << what << " of " << id;
    ASSERT_LT(type, static_cast<int32_t>(kelMaxTypeDefs)) << what << " of " << id;
    EXPECT_EQ(def, kelTypeDefsLookupTab + type) << what << " of " << id;
    EXPECT_EQ(size, Type(type).size) << what << " of " << id;
}

TEST(SchemaNodes, RecordSlotsNameTypesOfTheirSize) {
    int secondOutputs = 0;
    for (uint32_t i = 0; i < kelMaxNodes; ++i) {
        const KelNode& n = Node(i);
        ExpectSlot(i, "output", n.outputType, n.outputSize, n.outputTypeDef);
        ExpectSlot(i, "input", n.inputType, n.inputSize, n.inputTypeDef);
        ExpectSlot(i, "second output", n.output2Type, n.output2Size, n.output2TypeDef);
        bool typed = n.isLeaf && !n.isUntypedLeaf;
        EXPECT_EQ(n.outputType != -1, typed) << i;
        if (!typed) {
            EXPECT_EQ(n.output2Type, -1) << i;
        }
        bool statLeaf = n.statLink != -1 && (n.isInstance || EndsWith(n.name, ".metadata"));
        if (typed) {
            EXPECT_EQ(n.output2Type == -1, statLeaf) << i;
        }
        if (n.output2Type > 14) ++secondOutputs;
    }
    EXPECT_GT(secondOutputs, 0) << "some command leaves return a second record of their own";
}

TEST(SchemaNodes, RootChildrenAndTheirSubtrees) {
    struct Top {
        int32_t id;
        const char* name;
        size_t size;
        bool contiguous;
    };
    const Top tops[] = {
        {1, "sysInfoNodeHashes", 1, true}, {2, "net", 410, true},     {412, "memory", 42, false},
        {453, "rpcStats", 1, true},        {454, "vm", 9, true},      {463, "world", 29, true},
        {492, "worldGroups", 38, false},   {518, "config", 3, true},  {521, "reliability", 82, false},
        {601, "hardware", 66, false},      {652, "sched", 228, true}, {880, "userworld", 234, true},
        {1123, "system", 198, false},      {1128, "tarnModules", 1, true},
        {1313, "storage", 115, false},     {1345, "timer", 4, true},  {1372, "perf", 49, false},
        {1442, "power", 17, true},         {1475, "worldlets", 17, true},
        {1498, "tarnAccess", 17, true},    {1518, "killswitches", 2, true},
        {1558, "statsRegistry", 142, true}, {1706, "tpm", 5, true},
    };
    std::vector<int32_t> children = ChildrenByParent(0);
    std::reverse(children.begin(), children.end());
    ASSERT_EQ(children.size(), 23u);
    size_t total = 1;
    for (size_t k = 0; k < 23; ++k) {
        const Top& t = tops[k];
        EXPECT_EQ(children[k], t.id);
        EXPECT_STREQ(Node(t.id).name, t.name);
        std::vector<int32_t> ids = Subtree(t.id);
        std::sort(ids.begin(), ids.end());
        EXPECT_EQ(ids.size(), t.size) << t.name;
        bool contiguous = ids.back() - ids.front() + 1 == static_cast<int32_t>(ids.size());
        EXPECT_EQ(contiguous, t.contiguous) << t.name;
        if (t.contiguous) {
            EXPECT_EQ(ids.front(), t.id) << t.name << " starts below its top";
        }
        total += ids.size();
    }
    EXPECT_EQ(total, kelMaxNodes);
    std::vector<int32_t> stats = Subtree(1558);
    std::sort(stats.begin(), stats.end());
    EXPECT_EQ(stats.front(), 1558);
    EXPECT_EQ(stats.back(), 1699);
}

TEST(SchemaNodes, VirtualScsiRows) {
    const KelNode& groups = Node(492);
    EXPECT_STREQ(groups.name, "worldGroups");
    EXPECT_EQ(groups.parent, 0);
    EXPECT_TRUE(!groups.isLeaf && groups.isInstance && groups.isIntegerInstance);
    const KelNode& vscsi = Node(1314);
    EXPECT_STREQ(vscsi.name, "vscsi");
    EXPECT_EQ(vscsi.parent, 492);
    EXPECT_TRUE(!vscsi.isLeaf && vscsi.isInstance && vscsi.isIntegerInstance);
    EXPECT_EQ(vscsi.child, 1319);
    const KelNode& name = Node(1315);
    EXPECT_STREQ(name.name, "name");
    EXPECT_TRUE(name.isLeaf && !name.isInstance);
    EXPECT_EQ(name.outputType, 767);
    EXPECT_EQ(name.outputSize, 16u);
    EXPECT_EQ(name.output2Type, 14);
    EXPECT_EQ(name.sibling, -1);
    const char* others[] = {"stats", "shares", "bandwidthCap", "throughputCap"};
    for (int32_t k = 0; k < 4; ++k) {
        EXPECT_STREQ(Node(1316 + k).name, others[k]);
        EXPECT_EQ(Node(1316 + k).parent, 1314);
    }
    EXPECT_EQ(ChildrenByParent(1314).size(), 5u);
}

}  // namespace
