#include <gtest/gtest.h>

#include "StatsFixture.h"

namespace {

using TarnCtl::Sim::Fault;
using TarnCtl::Sim::IntKey;
using TarnCtl::Sim::Op;
using TarnCtl::Sim::StrKey;
using Strings = std::vector<std::string>;

class InstanceEnumeration : public TestSupport::StatsFixture {
protected:
    void SetUp() override {
        StatsFixture::SetUp();
        InstallTree(HostSim::SchemaTree());
        tree->AddInstance(1561, {}, IntKey(1001));
        tree->AddInstance(1561, {}, IntKey(9223372036854775808ull));
        tree->AddInstance(1562, {IntKey(1001)}, StrKey("lun b"));
        tree->AddInstance(1562, {IntKey(1001)}, StrKey("lun/a"));
    }
    bool List(unsigned node, long statId, const Strings& instances, unsigned level) {
        return impl->RetrieveKelStatAttrInstance(node, statId, instances, level, listed);
    }
    Strings listed;
};

TEST_F(InstanceEnumeration, OuterLevelIsListedAtTheParentAsDecimalTexts) {
    ASSERT_TRUE(List(1562, 0, {"*", "*"}, 0));
    EXPECT_EQ(listed, (Strings{"1001", "9223372036854775808"}));
    EXPECT_EQ(tree->NodeCounters(1561).lists, 1u);
    EXPECT_EQ(tree->NodeCounters(1562).lists, 0u);
}

TEST_F(InstanceEnumeration, InnerLevelIsListedBelowTheFixedLevels) {
    ASSERT_TRUE(List(1562, 0, {"1001", "*"}, 1));
    EXPECT_EQ(listed, (Strings{"lun b", "lun/a"}));
    // An instance that the signed path component cannot carry fails in the path, listing nothing.
    listed = {"kept"};
    EXPECT_FALSE(List(1562, 0, {"9223372036854775808", "*"}, 1));
    EXPECT_EQ(listed, Strings{"kept"});
    EXPECT_EQ(Warnings(), Strings{"failed to convert 9223372036854775808 to int"});
}

TEST_F(InstanceEnumeration, SingleLevelAndVnicPortListTheStatsOwnNode) {
    tree->AddInstance(1573, {}, IntKey(1001));
    ASSERT_TRUE(List(1573, 5, {"*"}, 0));
    EXPECT_EQ(listed, Strings{"1001"});
    tree->AddInstance(1630, {}, IntKey(50331649));
    tree->AddInstance(1630, {}, IntKey(50331650));
    ASSERT_TRUE(List(1630, 33, {"moid-1", "*"}, 1));  // the VM moid level adds no path component
    EXPECT_EQ(listed, (Strings{"50331649", "50331650"}));
}

TEST_F(InstanceEnumeration, EmptyListingClearsTheList) {
    listed = {"stale"};
    ASSERT_TRUE(List(1566, 2, {"*"}, 0));
    EXPECT_TRUE(listed.empty());
    EXPECT_TRUE(Warnings().empty());
}

TEST_F(InstanceEnumeration, FailingListingLogsBothMessages) {
    Fault fault;
    fault.op = Op::List;
    fault.node = 1561;
    fault.text = "listing refused";
    tree->AddFault(fault);
    EXPECT_FALSE(List(1562, 0, {"*", "*"}, 0));
    EXPECT_EQ(log.Entries(), (std::vector<TestSupport::LogEntry>{
                                 {"KELStatsImpl", 8, "failed to list attribute instance: listing refused"},
                                 {"KELStatsImpl", 8, "stat Id: 0, index: 0, type: 0"}}));
}

TEST_F(InstanceEnumeration, VmMoidWildcardListsANodeWithoutInstances) {
    // Stat 33's VM moid level has no instance node: one step above 1630 is the set branch 1629,
    // which the kernel refuses to list.
    EXPECT_FALSE(List(1630, 33, {"*", "*"}, 0));
    ASSERT_EQ(Warnings().size(), 2u);
    EXPECT_EQ(Warnings()[0].rfind("failed to list attribute instance: ", 0), 0u);
    EXPECT_EQ(Warnings()[1], "stat Id: 33, index: 0, type: 1");
    EXPECT_EQ(tree->NodeCounters(1629).binds, 1u);
}

TEST_F(InstanceEnumeration, UnknownDataTypeIsRefused) {
    auto& types = StatsRegistry::KELStats::_sStatAttrDataType[5];
    const long saved = types[0];
    types[0] = 7;
    const bool ok = List(1573, 5, {"*"}, 0);
    types[0] = saved;
    EXPECT_FALSE(ok);
    EXPECT_EQ(Warnings(), Strings{"unknown attribute list data type"});
    EXPECT_EQ(tree->NodeCounters(1573).lists, 0u);
}

TEST_F(InstanceEnumeration, OtherExceptionsAndBindFailuresPassThrough) {
    Fault fault;
    fault.op = Op::List;
    fault.node = 1561;
    fault.kind = Fault::Kind::ThrowOther;
    tree->AddFault(fault);
    EXPECT_THROW(List(1562, 0, {"*", "*"}, 0), std::runtime_error);
    tree->ClearFaults();
    fault.op = Op::Bind;
    fault.kind = Fault::Kind::ThrowKeel;
    tree->AddFault(fault);
    EXPECT_ANY_THROW(List(1562, 0, {"*", "*"}, 0));
    EXPECT_TRUE(Warnings().empty());
}

}  // namespace
