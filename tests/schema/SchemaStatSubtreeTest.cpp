// The stat subtree: read nodes, their instance levels and their .metadata leaves.
#include <gtest/gtest.h>

#include <map>
#include <set>
#include <string>
#include <vector>

#include "SchemaTestSupport.h"

namespace {

using namespace SchemaTest;

// Read node -> number of stats it returns (the stat set sizes of the catalogue).
const std::map<int32_t, uint32_t> kReadNodes = {
    {1562, 2}, {1566, 1}, {1569, 2}, {1573, 2}, {1580, 2}, {1585, 2}, {1590, 5}, {1598, 2},
    {1603, 2}, {1608, 2}, {1613, 4}, {1619, 5}, {1626, 2}, {1630, 2}, {1635, 1}, {1638, 1},
    {1641, 1}, {1644, 1}, {1647, 1}, {1650, 1}, {1654, 4}, {1659, 4}, {1667, 1}, {1670, 2},
    {1673, 3}, {1678, 7}, {1687, 4}, {1693, 3}, {1698, 1},
};

bool IsMetadata(const KelNode& n) { return EndsWith(n.name, ".metadata"); }

// The object-type suffix of a name: the text after its last 'X'.
std::string ObjectSuffix(std::string name) {
    if (EndsWith(name, ".metadata")) name.resize(name.size() - 9);
    return name.substr(name.rfind('X'));
}

TEST(SchemaStatSubtree, ReadNodesDeclareTheirStatSetRecord) {
    int32_t expectedStat = 0;
    for (const auto& [id, n] : kReadNodes) {
        const KelNode& read = Node(id);
        ASSERT_TRUE(read.isLeaf) << id;
        EXPECT_EQ(std::string(read.outputTypeDef->name),
                  "StatsRegistry_GetStruct" + std::to_string(n)) << id;
        EXPECT_EQ(read.outputSize, 4 + 16 * n) << id;
        EXPECT_EQ(read.statLink, id + static_cast<int32_t>(n)) << id;
        EXPECT_EQ(read.output2Type, read.isInstance ? -1 : 14) << id;
        int32_t category = read.isInstance ? -1 : read.parent;
        if (read.isInstance) {
            // Up through the argK levels to the set branch, whose parent is the category.
            int32_t cur = id, levels = 0;
            while (Node(cur).isInstance) {
                ++levels;
                cur = Node(cur).parent;
            }
            for (int32_t k = levels, at = id; k >= 1; --k, at = Node(at).parent) {
                EXPECT_EQ(std::string(Node(at).name), "arg" + std::to_string(k)) << id;
                EXPECT_EQ(ChildrenByParent(Node(at).parent).size(), 1u) << at;
            }
            category = Node(cur).parent;
            EXPECT_EQ(ObjectSuffix(Node(cur).name), ObjectSuffix(Node(id + 1).name)) << id;
        } else {
            EXPECT_EQ(ObjectSuffix(read.name), ObjectSuffix(Node(id + 1).name)) << id;
        }
        EXPECT_EQ(Node(category).parent, 1558) << id;
        for (uint32_t k = 1; k <= n; ++k) {
            const KelNode& leaf = Node(id + static_cast<int32_t>(k));
            ASSERT_TRUE(IsMetadata(leaf)) << leaf.id;
            EXPECT_EQ(leaf.parent, category) << leaf.id;
            EXPECT_EQ(leaf.statLink, expectedStat++) << leaf.id;
            EXPECT_EQ(ObjectSuffix(leaf.name), ObjectSuffix(Node(id + 1).name)) << leaf.id;
        }
    }
    EXPECT_EQ(expectedStat, 70);
}

TEST(SchemaStatSubtree, MetadataLeavesAndStatLinks) {
    int metadata = 0;
    std::set<int32_t> reads;
    for (uint32_t i = 0; i < kelMaxNodes; ++i) {
        const KelNode& n = Node(i);
        bool inStats = i >= 1558 && i <= 1699;
        if (IsMetadata(n)) {
            ++metadata;
            EXPECT_TRUE(inStats) << i;
            EXPECT_TRUE(n.isLeaf && !n.isInstance && !n.hasInput && !n.flag7) << i;
            EXPECT_EQ(n.outputType, 1047) << i;
            EXPECT_EQ(n.outputSize, 572u) << i;
            EXPECT_EQ(n.output2Type, -1) << i;
        } else if (n.statLink != -1) {
            reads.insert(static_cast<int32_t>(i));
        }
    }
    EXPECT_EQ(metadata, 70);
    std::set<int32_t> expected;
    for (const auto& entry : kReadNodes) expected.insert(entry.first);
    EXPECT_EQ(reads, expected);
    EXPECT_EQ(Node(1590).statLink, 1595);
    for (int32_t k = 0; k < 5; ++k) EXPECT_EQ(Node(1591 + k).statLink, 11 + k);
    EXPECT_STREQ(Node(1563).name, "scsiReservationConflictsXvmLUN.metadata");
    EXPECT_STREQ(Node(1592).name, "OIOsPctXstorageAdapter.metadata");
    EXPECT_STREQ(Node(1699).name, "usageXVM.metadata");
}

TEST(SchemaStatSubtree, CategoriesSetBranchesAndInstanceLevels) {
    const std::map<int32_t, const char*> categories = {
        {1559, "disk"}, {1568, "diskThroughput"}, {1576, "virtualDisk"},
        {1577, "virtualDiskThroughput"}, {1588, "storageAdapter"},
        {1596, "storageAdapterThroughput"}, {1601, "storagePath"},
        {1606, "storagePathThroughput"}, {1611, "net"}, {1612, "netThroughput"},
        {1633, "netThroughputUsage"}, {1652, "cpuCapacity"}, {1664, "cpuCoreCount"},
        {1677, "mem"}, {1692, "powerCapacity"}};
    std::vector<int32_t> children = ChildrenByParent(1558);
    ASSERT_EQ(children.size(), categories.size());
    for (int32_t c : children) {
        ASSERT_EQ(categories.count(c), 1u) << c;
        EXPECT_STREQ(Node(c).name, categories.at(c));
        EXPECT_FALSE(Node(c).isLeaf || Node(c).isInstance || Node(c).flag7) << c;
    }
    EXPECT_EQ(Node(1611).child, -1);

    // From read node 1562 one step up is an instance level, two steps the set branch.
    EXPECT_EQ(Node(1562).parent, 1561);
    EXPECT_STREQ(Node(1561).name, "arg1");
    EXPECT_TRUE(Node(1561).isInstance && Node(1561).isIntegerInstance);
    EXPECT_FALSE(Node(1562).isIntegerInstance);
    EXPECT_EQ(Node(1561).parent, 1560);
    EXPECT_STREQ(Node(1560).name, "vmLunDiskSetXvmLUN");
    EXPECT_FALSE(Node(1560).isInstance);

    // Numbered and named levels: integer keys on VM, vCPU, vNIC and virtual disk levels.
    const std::map<int32_t, bool> integerLevels = {
        {1561, true}, {1562, false}, {1566, false}, {1573, true}, {1579, true}, {1580, true},
        {1584, true}, {1585, true},  {1590, false}, {1598, false}, {1603, false}, {1608, false},
        {1619, false}, {1626, true}, {1630, true}, {1635, false}, {1654, true}, {1666, true},
        {1667, true}, {1670, true},  {1687, true},  {1698, true}};
    for (const auto& [id, integer] : integerLevels) {
        EXPECT_TRUE(Node(id).isInstance) << id;
        EXPECT_EQ(Node(id).isIntegerInstance != 0, integer) << id;
    }
    int instances = 0;
    for (int32_t i = 1558; i <= 1699; ++i) {
        const KelNode& n = Node(i);
        instances += n.isInstance;
        EXPECT_FALSE(n.hasInput || n.isUntypedLeaf || n.flag4 || n.flag5 || n.flag7) << i;
    }
    EXPECT_EQ(instances, 27);
    EXPECT_STREQ(Node(1597).name, "storageAdapterThroughputSetXstorageAdapter");
}

}  // namespace
