// The host description loader: what a good file turns into, and the exact report for bad ones.
#include <gtest/gtest.h>

#include <fstream>
#include <string>

#include "hostsim/HostFile.h"
#include "tools/JsonPositions.h"

namespace {

using HostSim::HostFileError;
using HostSim::ParseHostText;

const char* const kGood = R"({
  "version": 1,
  "host": {"values": {"mem.capacity.usage": 4096, "disk.throughput.usage": -5}},
  "luns": ["lun.a", {"name": "lun.b", "values": {"disk.scsiReservationConflicts": 7}}],
  "adapters": [{"name": "hba0", "values": {"storageAdapter.queueDepth": 64}}],
  "paths": ["hba0:C0:T0:L0"],
  "pnics": [{"name": "up0", "values": {"net.throughput.usage.nfs": 9}}],
  "vms": [
    {"moid": "moid-1", "worldId": 11, "worldGroupId": 10, "comment": "first",
     "vcpus": [{}, {"values": {"cpu.corecount.contention": 5}}],
     "vnics": [500, {"port": 501, "values": {"net.throughput.contention": 3}}],
     "disks": [{"handle": 8192, "name": "d0", "values": {"virtualDisk.throughput.usage": 77, "virtualDisk.busResets": 2}}],
     "luns": [{"name": "lun.b", "values": {"disk.scsiReservationCnflctsPct": 4}}],
     "values": {"cpu.capacity.usage": 1200, "net.throughput.usage": 300}},
    {"moid": "moid-2", "worldId": 21, "worldGroupId": 20}
  ]
})";

TEST(HostFile, GoodFileGivesTheWholeHost) {
    const HostSim::Host host = ParseHostText(kGood, "good.json");
    EXPECT_EQ(host.luns, (std::vector<std::string>{"lun.a", "lun.b"}));
    EXPECT_EQ(host.adapters, (std::vector<std::string>{"hba0"}));
    EXPECT_EQ(host.paths, (std::vector<std::string>{"hba0:C0:T0:L0"}));
    EXPECT_EQ(host.pnics, (std::vector<std::string>{"up0"}));
    ASSERT_EQ(host.vms.size(), 2u);
    const auto& vm = host.vms[0];
    EXPECT_EQ(vm.moid, "moid-1");
    EXPECT_EQ(vm.worldId, 11u);
    EXPECT_EQ(vm.worldGroupId, 10u);
    EXPECT_EQ(vm.vcpus, 2u);
    EXPECT_EQ(vm.vnicPorts, (std::vector<uint64_t>{500, 501}));
    ASSERT_EQ(vm.disks.size(), 1u);
    EXPECT_EQ(vm.disks[0].handle, 8192u);
    EXPECT_EQ(vm.disks[0].name, "d0");
    EXPECT_EQ(vm.luns, (std::vector<std::string>{"lun.b"}));
    EXPECT_EQ(host.vms[1].vcpus, 1u) << "a VM without vcpus has one";
    EXPECT_TRUE(host.vms[1].disks.empty());

    // Each value lands under the instance texts the host model reads: world group ids for the
    // virtual disk sets and "VM group ID", world ids for other VM stats, "*" for the VM moid level.
    EXPECT_EQ(HostSim::ValueOf(host, 58, {}), 4096);
    EXPECT_EQ(HostSim::ValueOf(host, 3, {}), -5);
    EXPECT_EQ(HostSim::ValueOf(host, 2, {"lun.b"}), 7);
    EXPECT_EQ(HostSim::ValueOf(host, 14, {"hba0"}), 64);
    EXPECT_EQ(HostSim::ValueOf(host, 36, {"up0"}), 9);
    EXPECT_EQ(HostSim::ValueOf(host, 49, {"11", "1"}), 5);
    EXPECT_EQ(HostSim::ValueOf(host, 34, {"moid-1", "501"}), 3);
    EXPECT_EQ(HostSim::ValueOf(host, 7, {"10", "d0"}), 77);
    EXPECT_EQ(HostSim::ValueOf(host, 10, {"10", "d0"}), 2);
    EXPECT_EQ(HostSim::ValueOf(host, 1, {"11", "lun.b"}), 4);
    EXPECT_EQ(HostSim::ValueOf(host, 42, {"11"}), 1200);
    EXPECT_EQ(HostSim::ValueOf(host, 31, {"10"}), 300);
    EXPECT_EQ(host.values.size(), 12u);
    EXPECT_NO_THROW(HostSim::BuildTree(host));
}

TEST(HostFile, MinimalFileIsAnEmptyHost) {
    const HostSim::Host host = ParseHostText(R"({"version": 1})", "min.json");
    EXPECT_TRUE(host.vms.empty());
    EXPECT_TRUE(host.luns.empty());
    EXPECT_TRUE(host.values.empty());
}

struct BadCase {
    const char* text;
    std::size_t line, column;
    const char* pointer;
    const char* message;
};

TEST(HostFile, EveryBadFileIsReportedWithPositionPointerAndExpectation) {
    const BadCase cases[] = {
        // Syntax, at the parser's position (the last byte it read), without its raw last-read bytes.
        {"", 1, 1, "", "syntax error while parsing value: unexpected end of input; expected '[', '{', or a literal"},
        {"{\"version\": 1,\n}", 2, 1, "", "syntax error while parsing object key: unexpected '}'; expected string literal"},
        {"{\"version\": tru}", 1, 16, "", "syntax error while parsing value: invalid literal"},
        {"{\"version\": 1} x", 1, 16, "", "syntax error while parsing value: invalid literal; expected end of input"},
        // Structure.
        {"[]", 1, 1, "", "expected an object, found an array"},
        {"{}", 1, 1, "", "missing member \"version\""},
        {"{\"version\": \"1\"}", 1, 13, "/version", "expected 1, found the string \"1\""},
        {"{\"version\": 1, \"vm\": []}", 1, 16, "/vm",
         "unknown member \"vm\"; expected one of: version, host, vms, luns, adapters, paths, pnics, comment"},
        {"{\"version\": 1, \"version\": 1}", 1, 16, "/version", "duplicate member \"version\""},
        {"{\"version\": 1, \"comment\": 5}", 1, 27, "/comment", "expected a string, found the number 5"},
        {"{\"version\": 1, \"vms\": {}}", 1, 23, "/vms", "expected an array, found an object"},
        // VMs.
        {"{\"version\": 1, \"vms\": [{\"moid\": \"a\", \"worldId\": 1}]}", 1, 24, "/vms/0",
         "missing member \"worldGroupId\""},
        {"{\"version\": 1, \"vms\": [{\"moid\": \"a\", \"worldId\": -1, \"worldGroupId\": 2}]}", 1, 49,
         "/vms/0/worldId", "expected an integer from 0 to 9223372036854775807, found the number -1"},
        {"{\"version\": 1, \"vms\": [{\"moid\": \"a\", \"worldId\": 1, \"worldGroupId\": 2},\n"
         "  {\"moid\": \"b\", \"worldId\": 1, \"worldGroupId\": 3}]}",
         2, 28, "/vms/1/worldId", "world id 1 is already used at /vms/0/worldId"},
        {"{\"version\": 1, \"vms\": [{\"moid\": \"a\", \"worldId\": 1, \"worldGroupId\": 2},\n"
         "  {\"moid\": \"a\", \"worldId\": 3, \"worldGroupId\": 4}]}",
         2, 12, "/vms/1/moid", "VM moid \"a\" is already used at /vms/0/moid"},
        {"{\"version\": 1, \"vms\": [{\"moid\": \"a\", \"worldId\": 1, \"worldGroupId\": 2, \"vcpus\": 0}]}", 1, 80,
         "/vms/0/vcpus", "expected a vCPU count from 1 to 256 or an array of 1 to 256 vCPU objects, found the number 0"},
        {"{\"version\": 1, \"vms\": [{\"moid\": \"a\", \"worldId\": 1, \"worldGroupId\": 2, \"vnics\": [7, 7]}]}", 1, 84,
         "/vms/0/vnics/1", "vNIC port id 7 is already used at /vms/0/vnics/0"},
        {"{\"version\": 1, \"vms\": [{\"moid\": \"a\", \"worldId\": 1, \"worldGroupId\": 2,\n"
         " \"disks\": [{\"handle\": 1, \"name\": \"seventeen-bytes-x\"}]}]}",
         2, 34, "/vms/0/disks/0/name", "expected a name of at most 16 bytes, found 17 bytes"},
        {"{\"version\": 1, \"vms\": [{\"moid\": \"a\", \"worldId\": 1, \"worldGroupId\": 2,\n"
         " \"disks\": [{\"handle\": 1, \"name\": \"d\"}, {\"handle\": 1, \"name\": \"e\"}]}]}",
         2, 51, "/vms/0/disks/1/handle", "vSCSI handle 1 is already used at /vms/0/disks/0/handle"},
        {"{\"version\": 1, \"luns\": [\"x\"], \"vms\": [{\"moid\": \"a\", \"worldId\": 1, \"worldGroupId\": 2, \"luns\": [\"y\"]}]}",
         1, 95, "/vms/0/luns/0", "expected the name of a LUN listed under /luns, found \"y\""},
        // Named objects.
        {"{\"version\": 1, \"adapters\": [\"*\"]}", 1, 29, "/adapters/0",
         "expected a name, found \"*\", which stands for every instance"},
        {"{\"version\": 1, \"pnics\": [\"\"]}", 1, 26, "/pnics/0", "expected a name, found an empty string"},
        {"{\"version\": 1, \"paths\": [\"a\\tb\"]}", 1, 26, "/paths/0",
         "expected a name without control characters, found the string \"a\\tb\""},
        {"{\"version\": 1, \"luns\": [\"x\", {\"name\": \"x\"}]}", 1, 39, "/luns/1/name", "LUN \"x\" is already used at /luns/0"},
        {"{\"version\": 1, \"luns\": [3]}", 1, 25, "/luns/0", "expected a LUN name or an object with \"name\", found the number 3"},
        // Values.
        {"{\"version\": 1, \"host\": {\"values\": {\"net.throughput.usage\": 1.5}}}", 1, 60,
         "/host/values/net.throughput.usage",
         "expected an integer from -9223372036854775808 to 9223372036854775807, found a number that is not a 64-bit integer"},
        {"{\"version\": 1, \"host\": {\"values\": {\"mem.capacity.usage\": 9223372036854775808}}}", 1, 58,
         "/host/values/mem.capacity.usage",
         "expected an integer from -9223372036854775808 to 9223372036854775807, found the number 9223372036854775808"},
        {"{\"version\": 1, \"adapters\": [{\"name\": \"h\", \"values\": {\"disk.throughput.usage\": 1}}]}", 1, 54,
         "/adapters/0/values/disk.throughput.usage",
         "no stat of object type storageAdapter is named \"disk.throughput.usage\"; expected one of: "
         "storageAdapter.OIOsPct, storageAdapter.outstandingIOs, storageAdapter.queueDepth, "
         "storageAdapter.queueLatency, storageAdapter.queued, storageAdapter.throughput.cont, "
         "storageAdapter.throughput.usag"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.text);
        try {
            ParseHostText(c.text, "bad.json");
            ADD_FAILURE() << "accepted";
        } catch (const HostFileError& e) {
            EXPECT_EQ(e.Source(), "bad.json");
            EXPECT_EQ(e.Line(), c.line);
            EXPECT_EQ(e.Column(), c.column);
            EXPECT_EQ(e.Pointer(), c.pointer);
            if (c.message != nullptr) {
                EXPECT_EQ(e.Message(), c.message);
            }
            const std::string where = "bad.json:" + std::to_string(c.line) + ":" + std::to_string(c.column) + ": ";
            EXPECT_EQ(std::string(e.what()), where + (*c.pointer ? std::string(c.pointer) + ": " : "") + e.Message());
        }
    }
}

TEST(HostFile, FilesThatCannotBeReadNameThePath) {
    try {
        HostSim::LoadHostFile("/nonexistent/host.json");
        ADD_FAILURE() << "accepted";
    } catch (const HostFileError& e) {
        EXPECT_EQ(e.Line(), 0u);
        EXPECT_STREQ(e.what(), "/nonexistent/host.json: cannot open the file: No such file or directory");
    }
    EXPECT_THROW(HostSim::LoadHostFile("/"), HostFileError);

    const std::string path = ::testing::TempDir() + "host-file-test.json";
    std::ofstream(path) << kGood;
    EXPECT_EQ(HostSim::LoadHostFile(path).vms.size(), 2u);
}

TEST(HostFileJsonPositions, PointersAndPositionsFollowTheText) {
    const std::string text = "{\n  \"a/b\": [1, {\"~x\": \"\\u00e9\\\"\"}],\n\t\"\\u0063\": null\n}";
    const auto positions = HostSim::IndexJsonPositions(text);
    EXPECT_EQ(HostSim::PointerChild("", "a/b"), "/a~1b");
    const auto arr = positions.At("/a~1b");
    EXPECT_EQ(arr.key.line, 2u);
    EXPECT_EQ(arr.key.column, 3u);
    EXPECT_EQ(arr.value.column, 10u);
    EXPECT_EQ(positions.At("/a~1b/1").value.column, 14u);
    EXPECT_EQ(positions.At("/a~1b/1/~0x").value.column, 21u);
    // An escaped key is indexed by its decoded text, as a parser holds it.
    const auto c = positions.At("/c");
    EXPECT_EQ(c.key.line, 3u);
    EXPECT_EQ(c.key.column, 2u);
    EXPECT_EQ(c.value.column, 12u);
    // An unknown pointer gives the document's start.
    EXPECT_EQ(positions.At("/nope").value.line, 1u);
    EXPECT_EQ(positions.At("/nope").value.column, 1u);
}

TEST(HostFileJsonPositions, DuplicatesAndDeepNestingAreRefused) {
    try {
        HostSim::IndexJsonPositions("{\"a\": {\"b\": 1,\n \"b\": 2}}");
        ADD_FAILURE() << "accepted";
    } catch (const HostSim::JsonPositionError& e) {
        EXPECT_EQ(e.Pointer(), "/a/b");
        EXPECT_EQ(e.Where().line, 2u);
        EXPECT_EQ(e.Where().column, 2u);
    }
    // Same names in different objects are fine.
    EXPECT_NO_THROW(HostSim::IndexJsonPositions("[{\"a\": 1}, {\"a\": 2}]"));
    const unsigned limit = HostSim::JsonPositions::kMaxDepth;
    EXPECT_NO_THROW(HostSim::IndexJsonPositions(std::string(limit + 1, '[') + std::string(limit + 1, ']')));
    EXPECT_THROW(HostSim::IndexJsonPositions(std::string(limit + 2, '[') + std::string(limit + 2, ']')),
                 HostSim::JsonPositionError);
    // A deep file is a clean error of the loader, with the position of the first level too deep.
    try {
        ParseHostText("{\"version\": 1, \"x\": " + std::string(200, '[') + std::string(200, ']') + "}", "deep.json");
        ADD_FAILURE() << "accepted";
    } catch (const HostFileError& e) {
        EXPECT_EQ(e.Column(), 21u + limit);
        EXPECT_EQ(e.Message(), "nesting deeper than " + std::to_string(limit) + " levels");
    }
}

}  // namespace
