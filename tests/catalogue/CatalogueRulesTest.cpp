// The catalogue tables checked against the rules their readers rely on, over every row, plus spot
// checks of texts that no rule covers.
#include <gtest/gtest.h>

#include <cstring>
#include <iterator>
#include <map>
#include <numeric>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "tarnstats/StatCatalogue.h"
#include "tarnstats/StatRecords.h"

namespace {

using namespace StatsRegistry;

constexpr uint32_t kStats = 70;
constexpr uint32_t kAttributes = 27;
constexpr uint32_t kSets = 22;
constexpr uint32_t kMembers = 63;

const StatSetStatInfo& Member(const StatSet& set, uint32_t k) {
    return statSetStatInfoTab[set.statInfoIds[k]];
}

TEST(CatalogueCounts, CountsMatchTheTables) {
    EXPECT_EQ(statIdMax, kStats);
    EXPECT_EQ(statAttributeIdMax, kAttributes);
    EXPECT_EQ(statSetIdMax, kSets);
    EXPECT_EQ(statSetStatInfoIdMax, kMembers);
    EXPECT_EQ(std::size(statIdMap), statIdMax);
    EXPECT_EQ(std::size(statMetadataTab), statIdMax);
    EXPECT_EQ(std::size(statAttributesTab), statAttributeIdMax);
    EXPECT_EQ(std::size(statSetTab), statSetIdMax);
    EXPECT_EQ(std::size(statSetStatInfoTab), statSetStatInfoIdMax);

    uint32_t members = 0;
    for (const StatSet& set : statSetTab) members += set.numStats;
    EXPECT_EQ(members, statSetStatInfoIdMax);
}

// Every stat with a set is listed by that set exactly once, and every listed member points back.
TEST(CatalogueSets, MembershipIsMutualAndSharesNodeAndAttributes) {
    std::map<uint32_t, int> listedIn;  // stat id -> set id
    for (uint32_t s = 0; s < kSets; ++s) {
        const StatSet& set = statSetTab[s];
        ASSERT_GE(set.numStats, 1u) << "set " << s;
        ASSERT_LE(set.numStats, 7u) << "set " << s;
        ASSERT_LE(set.numStats, std::size(set.statInfoIds)) << "set " << s;
        for (uint32_t k = 0; k < set.numStats; ++k) {
            const uint32_t statId = Member(set, k).statId;
            ASSERT_LT(statId, kStats) << "set " << s;
            EXPECT_TRUE(listedIn.emplace(statId, static_cast<int>(s)).second) << "stat " << statId << " listed twice";
            EXPECT_EQ(statMetadataTab[statId].statSetId, static_cast<int32_t>(s)) << "stat " << statId;
        }
    }
    for (uint32_t i = 0; i < kStats; ++i) {
        const StatMetadata& stat = statMetadataTab[i];
        if (stat.statSetId < 0) {
            EXPECT_EQ(stat.statSetId, -1) << "stat " << i;
            EXPECT_EQ(listedIn.count(i), 0u) << "stat " << i;
            continue;
        }
        ASSERT_LT(static_cast<uint32_t>(stat.statSetId), kSets) << "stat " << i;
        const StatSet& set = statSetTab[stat.statSetId];
        EXPECT_EQ(listedIn.count(i), 1u) << "stat " << i << " is not a member of its set";
        EXPECT_EQ(statIdMap[i], set.node) << "stat " << i;
        EXPECT_EQ(stat.numAttributes, set.numAttributes) << "stat " << i;
        EXPECT_EQ(stat.attributeIds[0], set.attributeIds[0]) << "stat " << i;
        EXPECT_EQ(stat.attributeIds[1], set.attributeIds[1]) << "stat " << i;
    }

    std::set<uint32_t> setless;
    for (uint32_t i = 0; i < kStats; ++i) {
        if (statMetadataTab[i].statSetId == -1) setless.insert(i);
    }
    EXPECT_EQ(setless, (std::set<uint32_t>{2, 35, 36, 37, 38, 39, 40}));
}

// One node per stat set and one per stat without a set; no two of them alike.
TEST(CatalogueSets, EachSetAndEachSetlessStatHasANodeOfItsOwn) {
    std::map<uint32_t, std::string> owner;
    for (uint32_t s = 0; s < kSets; ++s) {
        EXPECT_TRUE(owner.emplace(statSetTab[s].node, "set " + std::to_string(s)).second)
            << "node " << statSetTab[s].node << " of set " << s << " also serves " << owner[statSetTab[s].node];
    }
    for (uint32_t i = 0; i < kStats; ++i) {
        if (statMetadataTab[i].statSetId != -1) continue;
        EXPECT_TRUE(owner.emplace(statIdMap[i], "stat " + std::to_string(i)).second)
            << "node " << statIdMap[i] << " of stat " << i << " also serves " << owner[statIdMap[i]];
    }
    std::set<uint32_t> nodes(std::begin(statIdMap), std::end(statIdMap));
    EXPECT_EQ(nodes.size(), 29u);
    EXPECT_EQ(owner.size(), 29u);
}

TEST(CatalogueSets, ValueAreaAndMemberOffsets) {
    for (uint32_t s = 0; s < kSets; ++s) {
        const StatSet& set = statSetTab[s];
        EXPECT_EQ(set.valuesSize, 8 * set.numStats) << "set " << s;
        EXPECT_EQ(set.reserved, 0u) << "set " << s;

        // Slots follow the member order, except in set 5 where stat 12 takes the last slot.
        std::vector<uint32_t> slots(set.numStats);
        std::iota(slots.begin(), slots.end(), 0u);
        if (s == 5) slots = {0, 4, 1, 2, 3};
        std::set<uint32_t> offsets;
        for (uint32_t k = 0; k < set.numStats; ++k) {
            EXPECT_EQ(Member(set, k).offset, 8 * slots[k]) << "set " << s << " member " << k;
            offsets.insert(Member(set, k).offset);
        }
        EXPECT_EQ(offsets.size(), set.numStats) << "set " << s << ": two members share a value slot";
    }

    const StatSet& adapters = statSetTab[5];
    ASSERT_EQ(adapters.numStats, 5u);
    std::vector<std::pair<uint32_t, uint32_t>> members;
    for (uint32_t k = 0; k < adapters.numStats; ++k) {
        members.emplace_back(Member(adapters, k).statId, Member(adapters, k).offset);
    }
    EXPECT_EQ(members, (std::vector<std::pair<uint32_t, uint32_t>>{{11, 0}, {12, 32}, {13, 8}, {14, 16}, {15, 24}}));
}

// Member entries are stored set by set, set 0 first, each used by one set; unused slots are -1.
TEST(CatalogueSets, MemberEntriesAreContiguousSetBySet) {
    int32_t next = 0;
    for (uint32_t s = 0; s < kSets; ++s) {
        const StatSet& set = statSetTab[s];
        for (uint32_t k = 0; k < std::size(set.statInfoIds); ++k) {
            if (k < set.numStats) {
                EXPECT_EQ(set.statInfoIds[k], next++) << "set " << s << " slot " << k;
            } else {
                EXPECT_EQ(set.statInfoIds[k], -1) << "set " << s << " slot " << k;
            }
        }
    }
    EXPECT_EQ(next, static_cast<int32_t>(statSetStatInfoIdMax));
}

// Attribute ids of stats and sets: the used slots are valid ids, the others -1.
TEST(CatalogueAttributes, AttributeSlotsAreInRangeOrUnused) {
    auto check = [](const char* what, uint32_t id, uint32_t numAttributes, const int32_t (&ids)[2]) {
        ASSERT_LE(numAttributes, 2u) << what << " " << id;
        for (uint32_t j = 0; j < 2; ++j) {
            if (j < numAttributes) {
                EXPECT_GE(ids[j], 0) << what << " " << id << " slot " << j;
                EXPECT_LT(ids[j], static_cast<int32_t>(statAttributeIdMax)) << what << " " << id << " slot " << j;
            } else {
                EXPECT_EQ(ids[j], -1) << what << " " << id << " slot " << j;
            }
        }
    };
    for (uint32_t i = 0; i < kStats; ++i) {
        check("stat", i, statMetadataTab[i].numAttributes, statMetadataTab[i].attributeIds);
    }
    for (uint32_t s = 0; s < kSets; ++s) check("set", s, statSetTab[s].numAttributes, statSetTab[s].attributeIds);
}

// Each attribute record belongs to exactly one owner: a stat set or a stat without a set.
TEST(CatalogueAttributes, EachRecordHasExactlyOneOwner) {
    std::map<int32_t, std::vector<std::string>> owners;
    for (uint32_t s = 0; s < kSets; ++s) {
        for (uint32_t j = 0; j < statSetTab[s].numAttributes; ++j) {
            owners[statSetTab[s].attributeIds[j]].push_back("set " + std::to_string(s));
        }
    }
    for (uint32_t i = 0; i < kStats; ++i) {
        const StatMetadata& stat = statMetadataTab[i];
        if (stat.statSetId != -1) continue;
        for (uint32_t j = 0; j < stat.numAttributes; ++j) {
            owners[stat.attributeIds[j]].push_back("stat " + std::to_string(i));
        }
    }
    for (int32_t a = 0; a < static_cast<int32_t>(kAttributes); ++a) {
        ASSERT_EQ(owners[a].size(), 1u) << "attribute " << a << " has " << owners[a].size() << " owners";
    }
    EXPECT_EQ(owners.size(), kAttributes);
}

TEST(CatalogueAttributes, CodesAndLevelOrder) {
    for (uint32_t a = 0; a < kAttributes; ++a) {
        const StatAttributeMetadata& attribute = statAttributesTab[a];
        EXPECT_GE(attribute.idMapType, SR_IDMAPTYPE_IDENTITY) << "attribute " << a;
        EXPECT_LE(attribute.idMapType, SR_IDMAPTYPE_VNIC_TO_PORT_ID) << "attribute " << a;
        // Code 3 names the synthetic VM level, which is never a catalogue attribute.
        EXPECT_NE(attribute.idMapType, SR_IDMAPTYPE_VM_MOID) << "attribute " << a;
        EXPECT_TRUE(attribute.type == SR_PARAMTYPE_INT || attribute.type == SR_PARAMTYPE_STRING) << "attribute " << a;
        EXPECT_EQ(attribute.allowWildCard, 1) << "attribute " << a;
        ASSERT_NE(attribute.name, nullptr);
        EXPECT_GT(std::strlen(attribute.name), 0u) << "attribute " << a;
    }
    // A virtual disk level is always the second one, after a level that names the VM.
    for (uint32_t i = 0; i < kStats; ++i) {
        const StatMetadata& stat = statMetadataTab[i];
        for (uint32_t j = 0; j < stat.numAttributes; ++j) {
            if (statAttributesTab[stat.attributeIds[j]].idMapType != SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE) continue;
            ASSERT_EQ(j, 1u) << "stat " << i;
            const int32_t previous = statAttributesTab[stat.attributeIds[0]].idMapType;
            EXPECT_TRUE(previous == SR_IDMAPTYPE_VM_MOID_TO_WORLDID || previous == SR_IDMAPTYPE_VM_MOID_TO_WORLDGROUPID)
                << "stat " << i;
        }
    }
}

TEST(CatalogueStats, CodesAndConstantColumns) {
    for (uint32_t i = 0; i < kStats; ++i) {
        const StatMetadata& stat = statMetadataTab[i];
        EXPECT_EQ(stat.reserved, 0u) << "stat " << i;
        EXPECT_EQ(stat.transformType, SR_TRANSFORMTYPE_NONE) << "stat " << i;
        EXPECT_EQ(stat.statOptions, SR_STATOPTIONS_INVALID) << "stat " << i;
        ASSERT_NE(stat.localization, nullptr);
        EXPECT_STREQ(stat.localization, "en_US") << "stat " << i;

        EXPECT_GE(stat.objectType, SR_OBJECTTYPE_VIRTUALMACHINE) << "stat " << i;
        EXPECT_LE(stat.objectType, SR_OBJECTTYPE_HOST_LUN) << "stat " << i;
        EXPECT_NE(stat.objectType, SR_OBJECTTYPE_PHYSICALCPU) << "stat " << i;
        EXPECT_GE(stat.valueType, SR_VALUETYPE_ABSOLUTE) << "stat " << i;
        EXPECT_LE(stat.valueType, SR_VALUETYPE_RATE) << "stat " << i;
        EXPECT_GE(stat.unit, SR_UNIT_PERCENT) << "stat " << i;
        EXPECT_LE(stat.unit, SR_UNIT_JOULE) << "stat " << i;
        // Delta stats sum up over an interval; every other stat is averaged.
        EXPECT_EQ(stat.rollupType, stat.valueType == SR_VALUETYPE_DELTA ? SR_ROLLUP_SUMMATION : SR_ROLLUP_AVERAGE)
            << "stat " << i;
        // Stats without attribute levels are host-wide and read with their set.
        if (stat.numAttributes == 0) {
            EXPECT_EQ(stat.objectType, SR_OBJECTTYPE_HOST) << "stat " << i;
            EXPECT_NE(stat.statSetId, -1) << "stat " << i;
        }
        ASSERT_NE(stat.label, nullptr);
        ASSERT_NE(stat.description, nullptr);
        EXPECT_GT(std::strlen(stat.label), 0u) << "stat " << i;
        EXPECT_GT(std::strlen(stat.description), 0u) << "stat " << i;
    }
}

TEST(CatalogueStats, NamesAreShortAndUniqueWithTheirObjectType) {
    std::set<std::string> names;
    std::set<std::pair<std::string, int32_t>> keys;
    for (uint32_t i = 0; i < kStats; ++i) {
        const StatMetadata& stat = statMetadataTab[i];
        ASSERT_NE(stat.name, nullptr);
        EXPECT_LE(std::strlen(stat.name), 30u) << "stat " << i << " " << stat.name;
        names.insert(stat.name);
        EXPECT_TRUE(keys.emplace(stat.name, stat.objectType).second)
            << "stat " << i << ": " << stat.name << " with object type " << stat.objectType << " twice";
    }
    EXPECT_EQ(names.size(), 49u);
}

// Texts that no rule covers: a few rows compared as the kernel spells them.
TEST(CatalogueStats, SpotChecksOfTexts) {
    struct Row {
        uint32_t id;
        const char* name;
        int32_t objectType;
        const char* label;
        const char* description;
    };
    const Row rows[] = {
        {0, "disk.scsiReservationConflicts", SR_OBJECTTYPE_VM_LUN, "Disk SCSI Reservation Conflicts",
         "Number of SCSI reservation conflicts for the LUN during the collection interval"},
        {12, "storageAdapter.OIOsPct", SR_OBJECTTYPE_STORAGEADAPTER, "Storage Adapter Outstanding I/Os",
         "The percent of I/Os that have been issued but have not yet completed"},
        {16, "storageAdapter.throughput.usag", SR_OBJECTTYPE_STORAGEADAPTER, "Storage Adapter Throughput Usage",
         "The storage adapter's I/O rate"},
        {25, "net.throughput.contention", SR_OBJECTTYPE_HOST, "Net Throughput Contention",
         "The aggregate network droppped packets for the host"},
        {30, "net.throughput.packetsPerSec", SR_OBJECTTYPE_PHYSICALNIC,
         "pNic Packets Received and Transmitted per second",
         "Average rate of packets received and transmitted per second"},
        {41, "cpu.capacity.entitlement", SR_OBJECTTYPE_VIRTUALMACHINE, "CPU Capacity Entitlement",
         "CPU resources devoted by the Orvex scheduler to the virtual machines and resource pools"},
        {55, "mem.reservedCapacityPct", SR_OBJECTTYPE_HOST, "Memory Reserved Capacity %",
         "Percent of memory that has been reserved either through Tarnos use, by userworlds or due to VM memory "
         "reservations"},
        {68, "power.capacity.usagePct", SR_OBJECTTYPE_HOST, "Host Power Capacity Provisioned",
         "Current power usage as a percentage of maximum allowed power."},
        {69, "power.capacity.usage", SR_OBJECTTYPE_VIRTUALMACHINE, "Power Capacity Usage", "Current power usage"},
    };
    for (const Row& row : rows) {
        const StatMetadata& stat = statMetadataTab[row.id];
        EXPECT_STREQ(stat.name, row.name) << "stat " << row.id;
        EXPECT_EQ(stat.objectType, row.objectType) << "stat " << row.id;
        EXPECT_STREQ(stat.label, row.label) << "stat " << row.id;
        EXPECT_STREQ(stat.description, row.description) << "stat " << row.id;
    }

    EXPECT_STREQ(statSetTab[0].name, "vmLunDiskSet");
    EXPECT_STREQ(statSetTab[5].name, "storageAdapterSet");
    for (uint32_t s : {10u, 11u, 12u}) EXPECT_STREQ(statSetTab[s].name, "netThroughputSet") << "set " << s;
    EXPECT_STREQ(statSetTab[18].name, "hostMemSet");
    EXPECT_EQ(statSetTab[18].numStats, 7u);
    EXPECT_STREQ(statSetTab[21].name, "VMPowerCapacitySet");

    EXPECT_STREQ(statAttributesTab[14].name, "vNic PortID");
    EXPECT_EQ(statAttributesTab[14].idMapType, SR_IDMAPTYPE_VNIC_TO_PORT_ID);
    EXPECT_STREQ(statAttributesTab[26].name, "VM worldID");
}

TEST(CatalogueStats, NodesOfTheReadPaths) {
    EXPECT_EQ(statIdMap[0], 1562u);
    EXPECT_EQ(statIdMap[1], 1562u);
    EXPECT_EQ(statIdMap[2], 1566u);
    EXPECT_EQ(statIdMap[7], 1580u);
    EXPECT_EQ(statSetTab[1].node, 1569u);
    EXPECT_EQ(statSetTab[18].node, 1678u);
}

}  // namespace
