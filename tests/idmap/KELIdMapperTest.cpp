#include <gtest/gtest.h>

#include <stdexcept>

#include "StatsFixture.h"
#include "idmap/KELIdMapper.h"

namespace {

using StatsRegistry::KELIdMapper;
using TarnCtl::Sim::Fault;
using TarnCtl::Sim::IntKey;
using TarnCtl::Sim::Op;

class IdMapper : public TestSupport::StatsFixture {
protected:
    static constexpr uint64_t kGroup = 2001;
    void SetUp() override {
        StatsFixture::SetUp();
        InstallTree(HostSim::SchemaTree());
        tree->AddInstance(492, {}, IntKey(kGroup));
    }
    // Adds a handle whose 16-byte name record holds `bytes` (shorter records are stored as given).
    void AddHandle(uint64_t handle, const std::string& bytes) {
        tree->AddInstance(1314, {IntKey(kGroup)}, IntKey(handle));
        tree->SetRecord(1315, {IntKey(kGroup), IntKey(handle)}, std::vector<uint8_t>(bytes.begin(), bytes.end()));
    }
    static std::string Padded(const std::string& name) { return name + std::string(16 - name.size(), '\0'); }
    std::vector<TestSupport::LogEntry> MapperMessages() const {
        std::vector<TestSupport::LogEntry> out;
        for (const auto& e : log.Entries()) {
            if (e.logger == "KELIdMapper") out.push_back(e);
        }
        return out;
    }
};

TEST_F(IdMapper, NameAndHandleRoundTrip) {
    AddHandle(8193, Padded("web01-disk0"));
    AddHandle(8195, Padded("web01-disk1"));
    KELIdMapper mapper;
    std::string name = "old";
    ASSERT_TRUE(mapper.GetVscsiName(kGroup, 8195, name));
    EXPECT_EQ(name, "web01-disk1");
    unsigned long long handle = 0;
    ASSERT_TRUE(mapper.GetVscsiId(kGroup, "web01-disk1", handle));
    EXPECT_EQ(handle, 8195u);
    // One listing, then one name read per handle up to the match.
    EXPECT_EQ(tree->NodeCounters(1314).lists, 1u);
    EXPECT_EQ(tree->NodeCounters(1315).gets, 3u);
    EXPECT_TRUE(MapperMessages().empty());
}

TEST_F(IdMapper, NoHandleOrNoMatchIsLoggedAndLeavesTheOutput) {
    KELIdMapper mapper;
    unsigned long long handle = 99;
    EXPECT_FALSE(mapper.GetVscsiId(kGroup, "web01-disk0", handle));
    EXPECT_EQ(handle, 99u);
    AddHandle(8193, Padded("Web01-disk0"));
    AddHandle(8194, Padded("web01-disk0 "));
    EXPECT_FALSE(mapper.GetVscsiId(kGroup, "web01-disk0", handle));  // case and trailing blank differ
    EXPECT_FALSE(mapper.GetVscsiId(kGroup, "web01-disk0-and-more", handle));  // longer than 16 never matches
    EXPECT_EQ(handle, 99u);
    auto messages = MapperMessages();
    ASSERT_EQ(messages.size(), 3u);
    EXPECT_EQ(messages[0], (TestSupport::LogEntry{"KELIdMapper", 8, "failed to get vscsi id for (2001:web01-disk0)"}));
    EXPECT_EQ(messages[2].text, "failed to get vscsi id for (2001:web01-disk0-and-more)");
}

TEST_F(IdMapper, FirstOfTwoEqualNamesWins) {
    AddHandle(9000, Padded("shared"));
    AddHandle(8000, Padded("shared"));
    KELIdMapper mapper;
    unsigned long long handle = 0;
    ASSERT_TRUE(mapper.GetVscsiId(kGroup, "shared", handle));
    EXPECT_EQ(handle, 9000u);
    EXPECT_EQ(tree->NodeCounters(1315).gets, 1u);
}

TEST_F(IdMapper, NameRecordEdges) {
    AddHandle(1, "0123456789abcdef");               // 16 characters, no NUL
    AddHandle(2, Padded(""));                       // NUL first
    AddHandle(3, "abc");                            // a record shorter than 16 bytes
    KELIdMapper mapper;
    std::string name;
    ASSERT_TRUE(mapper.GetVscsiName(kGroup, 1, name));
    EXPECT_EQ(name, "0123456789abcdef");
    ASSERT_TRUE(mapper.GetVscsiName(kGroup, 2, name));
    EXPECT_EQ(name, "");
    ASSERT_TRUE(mapper.GetVscsiName(kGroup, 3, name));
    EXPECT_EQ(name, "abc");  // the buffer was zero-filled before the read
    unsigned long long handle = 0;
    ASSERT_TRUE(mapper.GetVscsiId(kGroup, "", handle));
    EXPECT_EQ(handle, 2u);

    // A read that writes nothing gives an empty name, never bytes of an earlier call.
    Fault nothing;
    nothing.op = Op::Get;
    nothing.node = 1315;
    nothing.kind = Fault::Kind::CopyNothing;
    tree->AddFault(nothing);
    name = "before";
    ASSERT_TRUE(mapper.GetVscsiName(kGroup, 1, name));
    EXPECT_EQ(name, "");
}

TEST_F(IdMapper, FailingNameReadIsSkipped) {
    AddHandle(1, Padded("target"));
    AddHandle(2, Padded("target"));
    Fault fault;
    fault.op = Op::Get;
    fault.node = 1315;
    fault.anyPath = false;
    fault.path = {IntKey(kGroup), IntKey(1)};
    fault.text = "device gone";
    tree->AddFault(fault);
    KELIdMapper mapper;
    std::string name = "kept";
    EXPECT_FALSE(mapper.GetVscsiName(kGroup, 1, name));
    EXPECT_EQ(name, "kept");
    unsigned long long handle = 0;
    ASSERT_TRUE(mapper.GetVscsiId(kGroup, "target", handle));
    EXPECT_EQ(handle, 2u);
    auto messages = MapperMessages();
    ASSERT_EQ(messages.size(), 2u);
    EXPECT_EQ(messages[0], (TestSupport::LogEntry{"KELIdMapper", 8, "failed to get vscsi name for (2001:1): device gone"}));
    EXPECT_EQ(messages[1], messages[0]);
}

TEST_F(IdMapper, FailingListingReadsNoName) {
    AddHandle(1, Padded("target"));
    Fault fault;
    fault.op = Op::List;
    fault.node = 1314;
    fault.text = "no such world group";
    tree->AddFault(fault);
    KELIdMapper mapper;
    unsigned long long handle = 5;
    EXPECT_FALSE(mapper.GetVscsiId(kGroup, "target", handle));
    EXPECT_EQ(handle, 5u);
    EXPECT_EQ(tree->NodeCounters(1315).gets, 0u);
    auto messages = MapperMessages();
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0].text, "failed to list vscsi id for (2001:target): no such world group");
}

TEST_F(IdMapper, UnknownWorldGroupFailsInTheListing) {
    KELIdMapper mapper;
    unsigned long long handle = 5;
    EXPECT_FALSE(mapper.GetVscsiId(4242, "target", handle));
    auto texts = log.Texts(8);
    ASSERT_EQ(texts.size(), 1u);
    EXPECT_EQ(texts[0].rfind("failed to list vscsi id for (4242:target): ", 0), 0u) << texts[0];
}

TEST_F(IdMapper, OtherExceptionsPassThrough) {
    AddHandle(1, Padded("target"));
    Fault fault;
    fault.op = Op::Get;
    fault.node = 1315;
    fault.kind = Fault::Kind::ThrowOther;
    tree->AddFault(fault);
    KELIdMapper mapper;
    unsigned long long handle = 5;
    EXPECT_THROW(mapper.GetVscsiId(kGroup, "target", handle), std::runtime_error);
    EXPECT_EQ(handle, 5u);
    tree->ClearFaults();
    Fault bind;
    bind.op = Op::Bind;
    bind.node = 1314;
    tree->AddFault(bind);  // a KeelException outside the guarded listing is not caught either
    EXPECT_ANY_THROW(mapper.GetVscsiId(kGroup, "target", handle));
    EXPECT_TRUE(MapperMessages().empty());
}

TEST_F(IdMapper, ClosedLevelWritesNothingAndGivesTheSameResults) {
    log.SetLevels(0);
    KELIdMapper mapper;
    unsigned long long handle = 5;
    const unsigned long before = Plinth::PrintFormatter::FormatCount();
    EXPECT_FALSE(mapper.GetVscsiId(kGroup, "target", handle));
    EXPECT_EQ(Plinth::PrintFormatter::FormatCount(), before);
    EXPECT_TRUE(log.Entries().empty());
}

}  // namespace
