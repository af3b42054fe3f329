#include <gtest/gtest.h>

#include "Keel/KeelException.h"
#include "StatsFixture.h"
#include "TarnCtl/Sysinfo.h"
#include "tarnstats/SysinfoSchema.h"

namespace {

using TarnCtl::Sim::IntKey;
using TarnCtl::Sim::Path;
using TarnCtl::Sim::StrKey;

// The path an accessor carries is observed through the tree: a record is stored at the expected
// path only, so the read succeeds exactly when PrepareKelPath built that path.
class PathPreparation : public TestSupport::StatsFixture {
protected:
    void SetUp() override {
        StatsFixture::SetUp();
        InstallTree(HostSim::SchemaTree());
    }
    void Expect(long statId, unsigned node, const std::vector<std::string>& instances, const Path& expected) {
        SCOPED_TRACE(TarnCtl::Sim::PathText(expected.data(), static_cast<unsigned>(expected.size())));
        unsigned at = node;
        std::vector<unsigned> chain(expected.size());
        for (size_t i = chain.size(); i-- > 0;) {
            chain[i] = at;
            at = static_cast<unsigned>(kelNodesLookupTab[at].parent);
        }
        for (size_t i = 0; i < chain.size(); ++i) {
            tree->AddInstance(chain[i], Path(expected.begin(), expected.begin() + static_cast<long>(i)), expected[i]);
        }
        tree->SetRecord(node, expected, TestSupport::Record(0, {}));
        TarnCtl::Util::Sysinfo accessor(node);
        ASSERT_TRUE(impl->PrepareKelPath(accessor, statId, instances, static_cast<unsigned>(instances.size())));
        std::vector<uint8_t> buffer(kelNodesLookupTab[node].outputSize);
        EXPECT_NO_THROW(accessor.Get(buffer.data(), static_cast<unsigned>(buffer.size())));
    }
};

TEST_F(PathPreparation, IntegerLevelsReadLikeStreamExtraction) {
    struct Case {
        const char* text;
        uint64_t key;
    } cases[] = {{"42", 42}, {" 42", 42}, {"+42", 42}, {"-1", ~0ull}, {"12abc", 12}, {"0x1f", 0},
                 {"9223372036854775807", 9223372036854775807ull}};
    for (const auto& c : cases) Expect(5, 1573, {c.text}, {IntKey(c.key)});
    EXPECT_TRUE(Warnings().empty());
}

TEST_F(PathPreparation, BadIntegerTextFailsWithItsMessage) {
    for (const char* text : {"", "abc", "9223372036854775808", "-9223372036854775809", "- 1"}) {
        log.Clear();
        TarnCtl::Util::Sysinfo accessor(1562);
        EXPECT_FALSE(impl->PrepareKelPath(accessor, 0, {text, "lun0"}, 2)) << text;
        EXPECT_EQ(Warnings(), std::vector<std::string>{std::string("failed to convert ") + text + " to int"});
    }
}

TEST_F(PathPreparation, StringLevelsPassThroughAndTypesFollowTheAttributes) {
    Expect(2, 1566, {"naa 01/02:x"}, {StrKey("naa 01/02:x")});
    Expect(0, 1562, {"1001", "lun.1"}, {IntKey(1001), StrKey("lun.1")});
    Expect(49, 1667, {"1001", "3"}, {IntKey(1001), IntKey(3)});
}

TEST_F(PathPreparation, VmMoidLevelAddsNothingAndKeepsTheIndex) {
    // Stat 33: the VM moid level is not read (it is no number), the port id comes from index 1.
    Expect(33, 1630, {"not a number", "50331649"}, {IntKey(50331649)});
    EXPECT_TRUE(Warnings().empty());
}

TEST_F(PathPreparation, CountLimitsTheLevels) {
    TarnCtl::Util::Sysinfo accessor(1561);
    // count 0 reads no string: the garbage level-0 text would otherwise fail.
    EXPECT_TRUE(impl->PrepareKelPath(accessor, 0, {"garbage", "lun"}, 0));
    EXPECT_TRUE(impl->PrepareKelPath(accessor, 3, {}, 0));
    // count 1 fixes level 0 only: the listing below it finds the instances of level 1.
    tree->AddInstance(1561, {}, IntKey(1001));
    tree->AddInstance(1562, {IntKey(1001)}, StrKey("lunA"));
    TarnCtl::Util::Sysinfo second(1562);
    ASSERT_TRUE(impl->PrepareKelPath(second, 0, {"1001", "unread"}, 1));
    std::vector<std::string> listed;
    second.List(listed);
    EXPECT_EQ(listed, std::vector<std::string>{"lunA"});
    EXPECT_TRUE(Warnings().empty());
}

TEST_F(PathPreparation, UnknownDataTypeIsRefused) {
    auto& codes = StatsRegistry::KELStats::_sStatAttrDataType[0];
    const long saved = codes[0];
    codes[0] = 2;
    TarnCtl::Util::Sysinfo accessor(1562);
    const bool ok = impl->PrepareKelPath(accessor, 0, {"1001", "lun"}, 2);
    codes[0] = saved;
    EXPECT_FALSE(ok);
    EXPECT_EQ(Warnings(), std::vector<std::string>{"unknown attribute data type: 2"});
}

}  // namespace
