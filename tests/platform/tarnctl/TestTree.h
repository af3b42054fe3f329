// A small hand-made sysinfo tree for the tests of the kernel control library stand-in.
//
// Node table (ids are the node numbers):
//   0 "root"
//   1 "groups"   instance branch, integer keys          (List: 0 keys)
//   2 "devices"  instance branch, integer keys, in 1    (List: 1 key)
//   3 "name"     leaf in 2, 16-byte record              (Get: 2 keys)
//   4 "stats"    plain branch
//   5 "arg1"     instance branch, integer keys, in 4    (List: 0 keys)
//   6 "arg2"     instance leaf, string keys, in 5, 36   (List: 1 key, Get: 2 keys)
//   7 "hostSet"  plain leaf in 4, 20-byte record        (Get: 0 keys)
//   8 "byName"   instance branch, string keys           (List: 0 keys)
//   9 "value"    leaf in 8, 8-byte record               (Get: 1 key)
//  10 "single"   instance leaf, integer keys, in 4, 4   (List: 0 keys, Get: 1 key)
//  11 "empty"    plain branch without children
//  12..18 "lvN"  a chain of integer instance branches, 12 in 0, each in the one before
//  19 "deep"     integer instance leaf in 18, 8 bytes   (Get: 8 keys)
//
// Populate() adds, in this order:
//   groups 100, 200; devices below [100]: 7, 8, 3 (none below [200]);
//   name records [100, 7] "disk7" (16 bytes), [100, 8] "disk8" (16 bytes), [100, 3] "ab" (2 bytes);
//   arg1 5, 6; arg2 below [5]: "naa.1", "naa.0", below [6]: "x";
//   arg2 records [5, "naa.1"] (36 bytes of 0x11), [5, "naa.0"] (40 bytes of 0x22), none for [6, "x"];
//   hostSet record [] (20 bytes of 0x33); byName "eth0", "eth1"; value ["eth0"] (8 bytes of 0x44);
//   single 42 and 2^64 - 5 (the key of -5), records (4 bytes of 0x55 and 0x66);
//   deep chain keys 1..8 with a record (8 bytes of 0x77).
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <string>
#include <vector>

#include "Keel/KeelException.h"
#include "TarnCtl/SimTree.h"
#include "TarnCtl/Sysinfo.h"

namespace TarnCtlTest {

using TarnCtl::Sim::IntKey;
using TarnCtl::Sim::Path;
using TarnCtl::Sim::StrKey;

enum Node : unsigned {
    kRoot = 0, kGroups, kDevices, kName, kStats, kArg1, kArg2, kHostSet, kByName, kValue, kSingle,
    kEmpty, kLv1, kDeep = 19, kNodeCount
};

inline TarnCtl::Sim::NodeInfo Info(const char* name, int32_t parent, bool leaf, bool instance = false,
                                   bool integer = false, uint32_t size = 0) {
    TarnCtl::Sim::NodeInfo n;
    n.name = name;
    n.parent = parent;
    n.isLeaf = leaf;
    n.isInstance = instance;
    n.isIntegerInstance = integer;
    n.outputSize = size;
    return n;
}

inline std::vector<TarnCtl::Sim::NodeInfo> TestNodes() {
    std::vector<TarnCtl::Sim::NodeInfo> n = {
        Info("root", 0, false),
        Info("groups", 0, false, true, true),
        Info("devices", 1, false, true, true),
        Info("name", 2, true, false, false, 16),
        Info("stats", 0, false),
        Info("arg1", 4, false, true, true),
        Info("arg2", 5, true, true, false, 36),
        Info("hostSet", 4, true, false, false, 20),
        Info("byName", 0, false, true, false),
        Info("value", 8, true, false, false, 8),
        Info("single", 4, true, true, true, 4),
        Info("empty", 0, false),
    };
    for (int i = 0; i < 7; ++i) {
        const std::string name = "lv" + std::to_string(i + 1);
        n.push_back(Info(name.c_str(), i == 0 ? 0 : kLv1 + i - 1, false, true, true));
    }
    n.push_back(Info("deep", kLv1 + 6, true, true, true, 8));
    return n;
}

inline std::vector<uint8_t> Bytes(std::size_t n, uint8_t value) { return std::vector<uint8_t>(n, value); }

inline std::vector<uint8_t> Text16(const std::string& s) {
    std::vector<uint8_t> b(16, 0);
    for (std::size_t i = 0; i < s.size() && i < 16; ++i) {
        b[i] = static_cast<uint8_t>(s[i]);
    }
    return b;
}

inline Path DeepPath(unsigned keys) {
    Path p;
    for (unsigned i = 1; i <= keys; ++i) {
        p.push_back(IntKey(i));
    }
    return p;
}

inline void Populate(TarnCtl::Sim::Tree& t) {
    t.AddInstance(kGroups, {}, IntKey(100));
    t.AddInstance(kGroups, {}, IntKey(200));
    for (uint64_t d : {7, 8, 3}) {
        t.AddInstance(kDevices, {IntKey(100)}, IntKey(d));
    }
    t.SetRecord(kName, {IntKey(100), IntKey(7)}, Text16("disk7"));
    t.SetRecord(kName, {IntKey(100), IntKey(8)}, Text16("disk8"));
    t.SetRecord(kName, {IntKey(100), IntKey(3)}, {'a', 'b'});
    t.AddInstance(kArg1, {}, IntKey(5));
    t.AddInstance(kArg1, {}, IntKey(6));
    t.AddInstance(kArg2, {IntKey(5)}, StrKey("naa.1"));
    t.AddInstance(kArg2, {IntKey(5)}, StrKey("naa.0"));
    t.AddInstance(kArg2, {IntKey(6)}, StrKey("x"));
    t.SetRecord(kArg2, {IntKey(5), StrKey("naa.1")}, Bytes(36, 0x11));
    t.SetRecord(kArg2, {IntKey(5), StrKey("naa.0")}, Bytes(40, 0x22));
    t.SetRecord(kHostSet, {}, Bytes(20, 0x33));
    t.AddInstance(kByName, {}, StrKey("eth0"));
    t.AddInstance(kByName, {}, StrKey("eth1"));
    t.SetRecord(kValue, {StrKey("eth0")}, Bytes(8, 0x44));
    t.AddInstance(kSingle, {}, IntKey(42));
    t.AddInstance(kSingle, {}, IntKey(static_cast<uint64_t>(-5LL)));
    t.SetRecord(kSingle, {IntKey(42)}, Bytes(4, 0x55));
    t.SetRecord(kSingle, {IntKey(static_cast<uint64_t>(-5LL))}, Bytes(4, 0x66));
    for (unsigned level = 0; level < 8; ++level) {
        const Path above = DeepPath(level);
        t.AddInstance(kLv1 + level, above, IntKey(level + 1));
    }
    t.SetRecord(kDeep, DeepPath(8), Bytes(8, 0x77));
}

// Installs a populated test tree for the duration of each test and uninstalls it afterwards.
class TreeTest : public ::testing::Test {
protected:
    void SetUp() override {
        tree_ = std::make_shared<TarnCtl::Sim::Tree>(TestNodes());
        Populate(*tree_);
        TarnCtl::Sim::Install(tree_);
    }
    void TearDown() override { TarnCtl::Sim::Install(nullptr); }

    std::shared_ptr<TarnCtl::Sim::Tree> tree_;
};

// The text of the KeelException that `f` throws; fails the test when it throws nothing or
// something else.
template <class F>
std::string KeelText(F&& f) {
    try {
        f();
    } catch (const Keel::Lib::KeelException& e) {
        return e.GetMessage(0);
    } catch (const std::exception& e) {
        ADD_FAILURE() << "threw another exception: " << e.what();
        return "<other exception>";
    }
    ADD_FAILURE() << "threw nothing";
    return "<no exception>";
}

// The text of the std::invalid_argument that `f` throws.
template <class F>
std::string InvalidText(F&& f) {
    try {
        f();
    } catch (const std::invalid_argument& e) {
        return e.what();
    } catch (const std::exception& e) {
        ADD_FAILURE() << "threw another exception: " << e.what();
        return "<other exception>";
    }
    ADD_FAILURE() << "threw nothing";
    return "<no exception>";
}

// Expects every one of `parts` in `text`.
inline void ExpectHas(const std::string& text, std::initializer_list<const char*> parts) {
    for (const char* p : parts) {
        EXPECT_NE(text.find(p), std::string::npos) << "missing \"" << p << "\" in: " << text;
    }
}

}  // namespace TarnCtlTest
