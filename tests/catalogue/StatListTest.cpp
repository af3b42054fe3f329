// GetStatsList: the records it appends, their attribute levels, and the code caches it fills.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "Plinth/Object.h"
#include "Plinth/Ref.h"
#include "tarnstats/KELStats.h"
#include "tarnstats/KELStatsImpl.h"
#include "tarnstats/StatCatalogue.h"

namespace {

using namespace StatsRegistry;

struct ExpectedAttribute {
    std::string name;
    int32_t idMapType;
    int32_t dataType;
    std::string attrType;
    int32_t objectType;
};

std::vector<long> Range(long first, long last) {
    std::vector<long> ids;
    for (long i = first; i <= last; ++i) ids.push_back(i);
    return ids;
}

// The attribute levels each stat presents, level 0 first.
std::vector<std::vector<ExpectedAttribute>> ExpectedAttributes() {
    const ExpectedAttribute worldId{"worldId", 1, 0, "vm", 0};
    const ExpectedAttribute worldID{"worldID", 1, 0, "vm", 0};
    const ExpectedAttribute pnic{"pNic hwnic name", 0, 1, "unknown type", -1};
    struct Group {
        std::vector<long> ids;
        std::vector<ExpectedAttribute> attributes;
    };
    const std::vector<Group> groups = {
        {{0, 1}, {worldId, {"lun device name", 0, 1, "unknown type", -1}}},
        {{2}, {{"lun device name", 0, 1, "unknown type", -1}}},
        {{5, 6}, {worldId}},
        {{7, 8}, {{"world id", 1, 0, "vm", 0}, {"vscsi handle", 4, 0, "unknown type", -1}}},
        {{9, 10}, {{"world group id", 1, 0, "vm", 0}, {"vscsi handle", 4, 0, "unknown type", -1}}},
        {Range(11, 15), {{"storage adapter", 0, 1, "unknown type", -1}}},
        {{16, 17}, {{"adapter", 0, 1, "unknown type", -1}}},
        {Range(18, 21), {{"path", 0, 1, "unknown type", -1}}},
        {Range(26, 30), {pnic}},
        {Range(35, 40), {pnic}},
        {{31, 32}, {{"VM group ID", 2, 0, "vm", 0}}},
        {{33, 34}, {{"vm", 3, 1, "vm", 0}, {"vNic PortID", 5, 0, "unknown type", -1}}},
        {Range(41, 44), {worldID}},
        {{50, 51}, {worldID}},
        {Range(62, 65), {worldID}},
        {{49}, {worldID, {"vcpu number", 0, 0, "unknown type", -1}}},
        {{69}, {{"VM worldID", 1, 0, "vm", 0}}},
    };
    std::vector<std::vector<ExpectedAttribute>> expected(70);  // stats not listed have none
    for (const Group& group : groups) {
        for (long id : group.ids) expected[id] = group.attributes;
    }
    return expected;
}

class StatList : public ::testing::Test {
protected:
    void SetUp() override { KELStatsFactory::GetKELStats(stats_); }
    Plinth::Ref<KELStats> stats_;
};

TEST_F(StatList, AppendsOneRecordPerStatInIdOrder) {
    Plinth::RefVector<StatDef> list;
    stats_->GetStatsList(list);
    ASSERT_EQ(list.size(), 70u);
    for (uint32_t i = 0; i < 70; ++i) {
        const StatDef& def = *list[i];
        const StatMetadata& stat = statMetadataTab[i];
        EXPECT_EQ(def.id, static_cast<long>(i));
        EXPECT_EQ(def.name, stat.name) << "stat " << i;
        EXPECT_EQ(def.label, stat.label) << "stat " << i;
        EXPECT_EQ(def.description, stat.description) << "stat " << i;
        EXPECT_EQ(def.valueType, stat.valueType) << "stat " << i;
        EXPECT_EQ(def.unit, stat.unit) << "stat " << i;
        EXPECT_EQ(def.rollupType, stat.rollupType) << "stat " << i;
        EXPECT_EQ(list[i]->GetRefCount(), 1) << "stat " << i << " is held by more than its list entry";
    }
    // Stats sharing a name stay separate records.
    for (long id : {24, 28, 31, 33}) EXPECT_EQ(list[id]->name, "net.throughput.usage");
    EXPECT_NE(list[31]->attributes.size(), list[33]->attributes.size());
}

TEST_F(StatList, AttributeLevelsOfEveryStat) {
    Plinth::RefVector<StatDef> list;
    stats_->GetStatsList(list);
    ASSERT_EQ(list.size(), 70u);
    const auto expected = ExpectedAttributes();
    for (uint32_t i = 0; i < 70; ++i) {
        const std::vector<StatAttribute>& attributes = list[i]->attributes;
        ASSERT_EQ(attributes.size(), expected[i].size()) << "stat " << i;
        EXPECT_EQ(attributes.capacity(), attributes.size()) << "stat " << i << ": not an exact-size copy";
        for (size_t j = 0; j < attributes.size(); ++j) {
            const StatAttribute& a = attributes[j];
            const ExpectedAttribute& e = expected[i][j];
            SCOPED_TRACE("stat " + std::to_string(i) + " level " + std::to_string(j));
            EXPECT_EQ(a.name, e.name);
            EXPECT_EQ(a.idMapType, e.idMapType);
            EXPECT_EQ(a.dataType, e.dataType);
            EXPECT_EQ(a.attrType, e.attrType);
            EXPECT_EQ(a.objectType, e.objectType);
            EXPECT_TRUE(a.allowWildCard);
        }
    }
}

TEST_F(StatList, CachesHoldTheCodesOfTheListedLevels) {
    Plinth::RefVector<StatDef> list;
    stats_->GetStatsList(list);
    ASSERT_EQ(KELStats::_sStatAttrIdMapType.size(), 70u);
    ASSERT_EQ(KELStats::_sStatAttrDataType.size(), 70u);
    for (uint32_t i = 0; i < 70; ++i) {
        const auto& attributes = list[i]->attributes;
        ASSERT_EQ(KELStats::_sStatAttrIdMapType[i].size(), attributes.size()) << "stat " << i;
        ASSERT_EQ(KELStats::_sStatAttrDataType[i].size(), attributes.size()) << "stat " << i;
        for (unsigned j = 0; j < attributes.size(); ++j) {
            EXPECT_EQ(KELStats::GetIdMapType(i, j), attributes[j].idMapType) << "stat " << i << " level " << j;
            EXPECT_EQ(KELStats::GetDataType(i, j), attributes[j].dataType) << "stat " << i << " level " << j;
        }
    }
    EXPECT_EQ(KELStats::_sStatAttrIdMapType[33], (std::vector<long>{3, 5}));
    EXPECT_EQ(KELStats::_sStatAttrDataType[33], (std::vector<long>{1, 0}));
    EXPECT_TRUE(KELStats::_sStatAttrIdMapType[3].empty());
    EXPECT_TRUE(KELStats::_sStatAttrDataType[3].empty());
}

TEST_F(StatList, HelpersOnFilledCaches) {
    Plinth::RefVector<StatDef> list;
    stats_->GetStatsList(list);
    EXPECT_EQ(KELStats::GetIdMapType(33, 0), 3);
    EXPECT_EQ(KELStats::GetDataType(33, 0), 1);
    EXPECT_EQ(KELStats::GetIdMapType(33, 1), 5);
    EXPECT_EQ(KELStats::GetDataType(33, 1), 0);
    EXPECT_TRUE(KELStats::IsPrevAttrVm(33, 1));
    EXPECT_TRUE(KELStats::IsPrevAttrVm(7, 1));
    EXPECT_TRUE(KELStats::IsPrevAttrVm(0, 1));
    EXPECT_EQ(KELStats::GetIdMapType(0, 1), 0);
}

// A later call appends the same records again, keeps what the list held and leaves the caches.
TEST_F(StatList, LaterCallsAppendAndLeaveTheCachesAlone) {
    Plinth::Ref<StatDef> sentinel(new StatDef);
    sentinel->name = "caller's own";
    Plinth::RefVector<StatDef> list;
    list.push_back(sentinel);

    stats_->GetStatsList(list);
    const auto idMapTypes = KELStats::_sStatAttrIdMapType;
    const auto dataTypes = KELStats::_sStatAttrDataType;
    const void* idMapStorage = KELStats::_sStatAttrIdMapType.data();

    Plinth::Ref<KELStats> other;
    KELStatsFactory::GetKELStats(other);
    other->GetStatsList(list);

    ASSERT_EQ(list.size(), 141u);
    EXPECT_EQ(list[0].Get(), sentinel.Get());
    EXPECT_EQ(sentinel->GetRefCount(), 2);
    for (size_t i = 1; i <= 70; ++i) {
        const StatDef& first = *list[i];
        const StatDef& second = *list[i + 70];
        SCOPED_TRACE("stat " + std::to_string(first.id));
        EXPECT_NE(&first, &second);
        EXPECT_EQ(second.id, first.id);
        EXPECT_EQ(second.name, first.name);
        EXPECT_EQ(second.label, first.label);
        EXPECT_EQ(second.description, first.description);
        EXPECT_EQ(second.valueType, first.valueType);
        EXPECT_EQ(second.unit, first.unit);
        EXPECT_EQ(second.rollupType, first.rollupType);
        ASSERT_EQ(second.attributes.size(), first.attributes.size());
        for (size_t j = 0; j < first.attributes.size(); ++j) {
            EXPECT_EQ(second.attributes[j].name, first.attributes[j].name);
            EXPECT_EQ(second.attributes[j].attrType, first.attributes[j].attrType);
            EXPECT_EQ(second.attributes[j].allowWildCard, first.attributes[j].allowWildCard);
            EXPECT_EQ(second.attributes[j].objectType, first.attributes[j].objectType);
            EXPECT_EQ(second.attributes[j].dataType, first.attributes[j].dataType);
            EXPECT_EQ(second.attributes[j].idMapType, first.attributes[j].idMapType);
        }
        EXPECT_EQ(list[i]->GetRefCount(), 1);
        EXPECT_EQ(list[i + 70]->GetRefCount(), 1);
    }
    EXPECT_EQ(KELStats::_sStatAttrIdMapType, idMapTypes);
    EXPECT_EQ(KELStats::_sStatAttrDataType, dataTypes);
    EXPECT_EQ(KELStats::_sStatAttrIdMapType.data(), idMapStorage) << "the caches were filled again";
}

// The records belong to the list alone: dropping the list destroys every one of them.
TEST_F(StatList, DroppingTheListDestroysTheRecords) {
    const long before = Plinth::ObjectImpl::LiveObjects();
    {
        Plinth::RefVector<StatDef> list;
        stats_->GetStatsList(list);
        EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before + 70);
    }
    EXPECT_EQ(Plinth::ObjectImpl::LiveObjects(), before);
}

}  // namespace
