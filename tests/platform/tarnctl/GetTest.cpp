// Get: leaves only, one key per instance level down to the leaf, the exact record size, and a
// copy that never passes the caller's size. Also the path building of the accessor.
#include <cstring>

#include "TestTree.h"

namespace {

using namespace TarnCtlTest;
using TarnCtl::Util::Sysinfo;

constexpr uint8_t kFill = 0xAA;
constexpr unsigned kSlack = 8;  // bytes after the size asked, which Get must not touch

// A buffer of `size` bytes plus slack, all kFill.
std::vector<uint8_t> Buffer(unsigned size) { return std::vector<uint8_t>(size + kSlack, kFill); }

unsigned CountOf(const std::vector<uint8_t>& b, unsigned from, unsigned to, uint8_t v) {
    unsigned n = 0;
    for (unsigned i = from; i < to; ++i) {
        n += b[i] == v ? 1 : 0;
    }
    return n;
}

using SysinfoGet = TreeTest;

TEST_F(SysinfoGet, CopiesExactlyTheRecordAndNeverPastTheSize) {
    auto buf = Buffer(16);
    Sysinfo name(kName);
    name.AddInstancePath(100ULL);
    name.AddInstancePath(7ULL);
    name.Get(buf.data(), 16);
    EXPECT_EQ(std::string(reinterpret_cast<const char*>(buf.data())), "disk7");
    EXPECT_EQ(CountOf(buf, 5, 16, 0), 11u);
    EXPECT_EQ(CountOf(buf, 16, 16 + kSlack, kFill), kSlack);

    // A stored record shorter than asked fills its own bytes and leaves the rest alone.
    buf = Buffer(16);
    Sysinfo shortOne(kName);
    shortOne.AddInstancePath(100ULL);
    shortOne.AddInstancePath(3ULL);
    shortOne.Get(buf.data(), 16);
    EXPECT_EQ(buf[0], 'a');
    EXPECT_EQ(buf[1], 'b');
    EXPECT_EQ(CountOf(buf, 2, 16 + kSlack, kFill), 14u + kSlack);

    // A longer one (40 bytes stored, 36 asked) is cut at the size.
    buf = Buffer(36);
    Sysinfo longOne(kArg2);
    longOne.AddInstancePath(5LL);
    longOne.AddInstancePath(std::string("naa.0"));
    longOne.Get(buf.data(), 36);
    EXPECT_EQ(CountOf(buf, 0, 36, 0x22), 36u);
    EXPECT_EQ(CountOf(buf, 36, 36 + kSlack, kFill), kSlack);

    // A node without instance levels reads with an empty path.
    buf = Buffer(20);
    Sysinfo(kHostSet).Get(buf.data(), 20);
    EXPECT_EQ(CountOf(buf, 0, 20, 0x33), 20u);
}

TEST_F(SysinfoGet, SignedKeysAreTheirTwosComplement) {
    uint8_t buf[4] = {};
    Sysinfo s(kSingle);
    s.AddInstancePath(-5LL);
    s.Get(buf, 4);
    EXPECT_EQ(buf[0], 0x66);
    Sysinfo u(kSingle);
    u.AddInstancePath(static_cast<unsigned long long>(-5LL));
    u.Get(buf, 4);
    EXPECT_EQ(buf[0], 0x66);
    Sysinfo p(kSingle);
    p.AddInstancePath(42LL);
    p.Get(buf, 4);
    EXPECT_EQ(buf[0], 0x55);
}

TEST_F(SysinfoGet, RejectsBranchesWrongSizesAndNullBuffers) {
    auto buf = Buffer(36);
    ExpectHas(KeelText([&] { Sysinfo(kStats).Get(buf.data(), 0); }),
              {"Get of sysinfo node 4 \"stats\" with path []", "not a leaf"});
    ExpectHas(KeelText([&] {
                  Sysinfo s(kDevices);
                  s.AddInstancePath(100ULL);
                  s.Get(buf.data(), 16);
              }),
              {"node 2 \"devices\" with path [100]", "not a leaf"});
    for (unsigned size : {15u, 17u, 0u}) {
        ExpectHas(KeelText([&] {
                      Sysinfo s(kName);
                      s.AddInstancePath(100ULL);
                      s.AddInstancePath(7ULL);
                      s.Get(buf.data(), size);
                  }),
                  {"node 3 \"name\" with path [100, 7]", ("size " + std::to_string(size) + " asked").c_str(),
                   "record size is 16"});
    }
    ExpectHas(KeelText([&] { Sysinfo(kHostSet).Get(nullptr, 20); }), {"node 7 \"hostSet\"", "null buffer"});
    EXPECT_EQ(CountOf(buf, 0, 36 + kSlack, kFill), 36u + kSlack);  // no failure wrote anything
}

TEST_F(SysinfoGet, NeedsOneKeyOfTheRightKindPerLevelIncludingAnInstanceLeaf) {
    uint8_t buf[36];
    ExpectHas(KeelText([&] {
                  Sysinfo s(kArg2);
                  s.AddInstancePath(5LL);
                  s.Get(buf, 36);
              }),
              {"node 6 \"arg2\" with path [5]", "takes 2 instance keys, 1 given"});
    ExpectHas(KeelText([&] {
                  Sysinfo s(kHostSet);
                  s.AddInstancePath(1ULL);
                  s.Get(buf, 20);
              }),
              {"node 7 \"hostSet\" with path [1]", "takes 0 instance keys, 1 given"});
    ExpectHas(KeelText([&] {
                  Sysinfo s(kArg2);
                  s.AddInstancePath(5LL);
                  s.AddInstancePath(1ULL);
                  s.Get(buf, 36);
              }),
              {"path [5, 1]", "key 1 (1) is integer", "level node 6 \"arg2\" takes string keys"});
    ExpectHas(KeelText([&] {
                  Sysinfo s(kValue);
                  s.AddInstancePath(0LL);
                  s.Get(buf, 8);
              }),
              {"node 9 \"value\" with path [0]", "level node 8 \"byName\" takes string keys"});
}

TEST_F(SysinfoGet, NamesTheMissingInstanceOrRecord) {
    uint8_t buf[36];
    ExpectHas(KeelText([&] {
                  Sysinfo s(kName);
                  s.AddInstancePath(200ULL);
                  s.AddInstancePath(7ULL);
                  s.Get(buf, 16);
              }),
              {"node 3 \"name\" with path [200, 7]", "key 1 (7) names no instance of node 2 \"devices\" below [200]"});
    ExpectHas(KeelText([&] {
                  Sysinfo s(kName);
                  s.AddInstancePath(1ULL);
                  s.AddInstancePath(7ULL);
                  s.Get(buf, 16);
              }),
              {"key 0 (1) names no instance of node 1 \"groups\""});
    // Instance present, record absent.
    ExpectHas(KeelText([&] {
                  Sysinfo s(kArg2);
                  s.AddInstancePath(6LL);
                  s.AddInstancePath(std::string("x"));
                  s.Get(buf, 36);
              }),
              {"node 6 \"arg2\" with path [6, \"x\"]", "no record stored for this path"});
}

TEST_F(SysinfoGet, PathsHoldEightKeysAndOverflowBeyond) {
    uint8_t buf[8] = {};
    Sysinfo s(kDeep);
    for (unsigned long long k = 1; k <= 8; ++k) {
        s.AddInstancePath(k);
    }
    s.Get(buf, 8);
    EXPECT_EQ(buf[7], 0x77);
    s.AddInstancePath(std::string("ninth"));
    ExpectHas(KeelText([&] { s.Get(buf, 8); }),
              {"node 19 \"deep\" with path [1, 2, 3, 4, 5, 6, 7, 8, ...]", "more than 8 instance keys"});
    std::vector<unsigned long long> numbers;
    ExpectHas(KeelText([&] { s.List(numbers); }), {"node 19 \"deep\"", "more than 8 instance keys"});
    s.AddInstancePath(10ULL);  // still no throw while building
    ExpectHas(KeelText([&] { s.Get(buf, 8); }), {"more than 8 instance keys"});
}

TEST_F(SysinfoGet, StringKeysAreQuotedAndEscapedInMessages) {
    uint8_t buf[8];
    ExpectHas(KeelText([&] {
                  Sysinfo s(kValue);
                  s.AddInstancePath(std::string("a\"b\\c\n"));
                  s.Get(buf, 8);
              }),
              {"path [\"a\\\"b\\\\c\\x0a\"]"});
    EXPECT_EQ(TarnCtl::Sim::PathText(nullptr, 0), "[]");
}

using SysinfoSetInstance = TreeTest;

TEST_F(SysinfoSetInstance, ReplacesThePathOnNodesTakingOneKey) {
    // A list taking one key.
    std::vector<unsigned long long> numbers;
    Sysinfo devices(kDevices);
    devices.AddInstancePath(1ULL);
    devices.AddInstancePath(2ULL);
    devices.SetInstance(100);
    devices.List(numbers);
    EXPECT_EQ(numbers, (std::vector<unsigned long long>{7, 8, 3}));

    // A read taking one key; SetInstance also clears an overflowed path.
    uint8_t buf[4] = {};
    Sysinfo single(kSingle);
    for (unsigned long long k = 0; k < 10; ++k) {
        single.AddInstancePath(k);
    }
    single.SetInstance(42);
    single.Get(buf, 4);
    EXPECT_EQ(buf[0], 0x55);

    // An instance leaf with one ancestor: its List takes the one key.
    std::vector<std::string> names;
    Sysinfo arg2(kArg2);
    arg2.SetInstance(6);
    arg2.List(names);
    EXPECT_EQ(names, (std::vector<std::string>{"x"}));
}

TEST_F(SysinfoSetInstance, FailsAtOnceOnNodesNotTakingOneKey) {
    for (unsigned node : {unsigned(kRoot), unsigned(kGroups), unsigned(kName), unsigned(kHostSet), unsigned(kDeep)}) {
        Sysinfo s(node);
        s.AddInstancePath(100ULL);
        const std::string text = KeelText([&] { s.SetInstance(1); });
        ExpectHas(text, {"SetInstance of sysinfo node", "with path [100]", "takes no single instance key"});
        ExpectHas(text, {("node " + std::to_string(node) + " \"" + tree_->Node(node).name + "\"").c_str()});
    }
    // A failed SetInstance leaves the path as it was.
    uint8_t buf[16];
    Sysinfo name(kName);
    name.AddInstancePath(100ULL);
    EXPECT_THROW(name.SetInstance(7), Keel::Lib::KeelException);
    name.AddInstancePath(8ULL);
    name.Get(buf, 16);
    EXPECT_EQ(buf[4], '8');

    // A one-key node whose level is string-keyed takes the integer key, which fails at use.
    Sysinfo value(kValue);
    value.SetInstance(3);
    ExpectHas(KeelText([&] { value.Get(buf, 8); }), {"node 9 \"value\" with path [3]", "takes string keys"});
}

}  // namespace
