// The schema as the tool names and shows it, and the metadata records it adds to a host's tree.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <sstream>

#include "TarnCtl/SimTree.h"
#include "hostsim/Host.h"
#include "tarnstats/StatCatalogue.h"
#include "tarnstats/SysinfoSchema.h"
#include "tools/CodeTexts.h"
#include "tools/MetadataRecords.h"
#include "tools/RecordDecoder.h"
#include "tools/SchemaView.h"
#include "tools/ToolError.h"

namespace {

std::string UsageMessage(const std::string& node) {
    try {
        Tool::ResolveNode(node);
    } catch (const Tool::UsageError& e) {
        return e.what();
    }
    return "accepted";
}

TEST(ToolSchemaView, EveryNodeIsFoundByItsIdAndByItsPath) {
    for (unsigned n = 0; n < kelMaxNodes; ++n) {
        const std::string path = Tool::NodePath(n);
        ASSERT_EQ(Tool::ResolveNode(path), n) << path;
        ASSERT_EQ(Tool::ResolveNode(std::to_string(n)), n);
    }
    const unsigned name = Tool::ResolveNode("/worldGroups/vscsi/name");
    EXPECT_EQ(name, 1315u);
    EXPECT_EQ(Tool::ResolveNode("root/worldGroups//vscsi/name/"), name);
    EXPECT_EQ(Tool::ResolveNode("worldGroups/vscsi/name"), name);
    EXPECT_EQ(Tool::ResolveNode("/"), 0u);
    EXPECT_EQ(Tool::ResolveNode("root"), 0u);
}

TEST(ToolSchemaView, BadNodesAreRefusedWithTheReason) {
    EXPECT_EQ(UsageMessage("1711"), "unknown node 1711: node ids run from 0 to 1710");
    EXPECT_EQ(UsageMessage("99999999999"), "unknown node 99999999999: node ids run from 0 to 1710");
    EXPECT_EQ(UsageMessage("statsRegistry/nope/x"), "unknown node \"statsRegistry/nope/x\": /statsRegistry has no child named \"nope\"");
    EXPECT_EQ(UsageMessage("-1"), "unknown node \"-1\": / has no child named \"-1\"");
    EXPECT_EQ(UsageMessage(""), "unknown node \"\": expected a node id or a path such as statsRegistry/disk");
}

TEST(ToolSchemaView, ChildrenAndInstanceLevelsFollowTheTreeLinks) {
    std::size_t total = 0;
    for (unsigned n = 0; n < kelMaxNodes; ++n) {
        const auto children = Tool::Children(n);
        for (std::size_t i = 0; i < children.size(); ++i) {
            EXPECT_EQ(kelNodesLookupTab[children[i]].parent, static_cast<int32_t>(n));
            if (i > 0) {
                EXPECT_LT(children[i - 1], children[i]);
            }
        }
        total += children.size();
    }
    EXPECT_EQ(total, kelMaxNodes - 1u) << "every node but the root is somebody's child";

    // A stat's read node needs one key per catalogue attribute level (a VM moid level is none).
    for (uint32_t id = 0; id < statIdMax; ++id) {
        const auto levels = Tool::InstanceLevels(statIdMap[id]);
        EXPECT_EQ(levels.size(), statMetadataTab[id].numAttributes) << "stat " << id;
        for (unsigned l : levels) EXPECT_TRUE(kelNodesLookupTab[l].isInstance);
    }
    EXPECT_EQ(Tool::InstanceLevels(1315), (std::vector<unsigned>{492, 1314}));
    EXPECT_TRUE(Tool::InstanceLevels(0).empty());
}

TEST(ToolSchemaView, SubtreesShowNamesKindsAndRecordTypes) {
    std::ostringstream out;
    Tool::PrintSubtree(out, 1577);
    EXPECT_EQ(out.str(),
              "1577 /statsRegistry/virtualDiskThroughput/\n"
              "  1578 virtualDiskThroughputSetXvDisk/\n"
              "    1579 arg1/ [int instance]\n"
              "      1580 arg2 [int instance] StatsRegistry_GetStruct2 (36 bytes)\n"
              "  1581 usageXvDisk.metadata StatsRegistry_Metadata (572 bytes)\n"
              "  1582 contXvDisk.metadata StatsRegistry_Metadata (572 bytes)\n");
    std::ostringstream top;
    Tool::PrintSubtree(top, 0, 1);
    const std::string text = top.str();
    EXPECT_EQ(std::count(text.begin(), text.end(), '\n'), 24) << "the root and its 23 children";
    EXPECT_EQ(text.substr(0, 4), "0 /\n");
    std::ostringstream all;
    Tool::PrintSubtree(all, 0);
    const std::string whole = all.str();
    EXPECT_EQ(static_cast<std::size_t>(std::count(whole.begin(), whole.end(), '\n')), kelMaxNodes);
}

// The decoded metadata record of a stat reads back the catalogue's own texts.
TEST(ToolMetadataRecords, EveryStatsRecordDecodesToItsCatalogueEntry) {
    const auto* type = Tool::FindType("StatsRegistry_Metadata");
    ASSERT_NE(type, nullptr);
    for (uint32_t id = 0; id < statIdMax; ++id) {
        SCOPED_TRACE(id);
        const auto& m = statMetadataTab[id];
        const auto record = Tool::MetadataRecord(id);
        ASSERT_EQ(record.size(), type->size);
        std::map<std::string, std::string> fields;
        for (const auto& [label, text] : Tool::DecodeRecord(*type, record.data(), record.size(), "")) fields[label] = text;
        EXPECT_EQ(fields["name"], "\"" + std::string(m.name) + "\"");
        EXPECT_EQ(fields["objectType"], Tool::ObjectTypeText(m.objectType));
        EXPECT_EQ(fields["valueType"], Tool::ValueTypeText(m.valueType));
        EXPECT_EQ(fields["unit"], Tool::UnitText(m.unit));
        EXPECT_EQ(fields["rollupType"], Tool::RollupText(m.rollupType));
        EXPECT_EQ(fields["label"], "\"" + std::string(m.label) + "\"");
        EXPECT_EQ(fields["description"], "\"" + std::string(m.description) + "\"");
        EXPECT_EQ(fields["localization"], "\"en_US\"");
        for (uint32_t j = 0; j < 2; ++j) {
            const std::string at = "attributes[" + std::to_string(j) + "].";
            if (j < m.numAttributes) {
                const auto& a = statAttributesTab[m.attributeIds[j]];
                EXPECT_EQ(fields[at + "name"], "\"" + std::string(a.name) + "\"");
                EXPECT_EQ(fields[at + "idMapType"], Tool::IdMapTypeText(a.idMapType));
                EXPECT_EQ(fields[at + "type"], Tool::ParamTypeText(a.type));
                EXPECT_EQ(fields[at + "allowWildCard"], "1");
            } else {
                EXPECT_EQ(fields[at + "name"], "\"\"");
                EXPECT_EQ(fields[at + "allowWildCard"], "0");
            }
        }
    }
}

TEST(ToolMetadataRecords, OneRecordPerMetadataLeafOfTheTree) {
    auto tree = HostSim::SchemaTree();
    Tool::AddMetadataRecords(*tree);
    const auto* type = Tool::FindType("StatsRegistry_Metadata");
    std::vector<bool> described(statIdMax, false);
    for (unsigned n = 0; n < kelMaxNodes; ++n) {
        const auto& node = kelNodesLookupTab[n];
        std::vector<uint8_t> buffer(node.outputSize, 0xee);
        const bool isMetadata = node.isLeaf && node.outputTypeDef == type;
        if (!isMetadata || node.statLink < 0) continue;
        ASSERT_NO_THROW(tree->Get(n, nullptr, 0, buffer.data(), node.outputSize)) << n;
        EXPECT_EQ(buffer, Tool::MetadataRecord(node.statLink));
        described[static_cast<std::size_t>(node.statLink)] = true;
    }
    EXPECT_EQ(std::count(described.begin(), described.end(), true), static_cast<long>(statIdMax));
}

}  // namespace
