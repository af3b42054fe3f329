// List: instance nodes only, one key per instance ancestor of the right kind, insertion order.
#include "TestTree.h"

namespace {

using namespace TarnCtlTest;
using TarnCtl::Util::Sysinfo;
using Numbers = std::vector<unsigned long long>;
using Names = std::vector<std::string>;

using SysinfoList = TreeTest;

TEST_F(SysinfoList, GivesInstancesInInsertionOrderAndReplacesTheVector) {
    Numbers numbers = {999, 998};
    Sysinfo groups(kGroups);
    groups.List(numbers);
    EXPECT_EQ(numbers, (Numbers{100, 200}));

    Sysinfo devices(kDevices);
    devices.AddInstancePath(100ULL);
    devices.List(numbers);
    EXPECT_EQ(numbers, (Numbers{7, 8, 3}));  // as added, not sorted

    // An instance leaf lists too, below its ancestors' keys.
    Names names = {"old"};
    Sysinfo arg2(kArg2);
    arg2.AddInstancePath(5LL);
    arg2.List(names);
    EXPECT_EQ(names, (Names{"naa.1", "naa.0"}));

    Sysinfo byName(kByName);
    byName.List(names);
    EXPECT_EQ(names, (Names{"eth0", "eth1"}));

    // An existing path with nothing added below it lists empty.
    Sysinfo other(kDevices);
    other.AddInstancePath(200ULL);
    other.List(numbers);
    EXPECT_TRUE(numbers.empty());
}

TEST_F(SysinfoList, RejectsNodesThatAreNoInstanceLevels) {
    Names names;
    ExpectHas(KeelText([&] { Sysinfo(kStats).List(names); }),
              {"List of sysinfo node 4 \"stats\" with path []", "not an instance node"});
    ExpectHas(KeelText([&] { Sysinfo(kHostSet).List(names); }), {"node 7 \"hostSet\"", "not an instance node"});
    Numbers numbers;
    ExpectHas(KeelText([&] {
                  Sysinfo s(kName);
                  s.AddInstancePath(100ULL);
                  s.AddInstancePath(7ULL);
                  s.List(numbers);
              }),
              {"node 3 \"name\" with path [100, 7]", "not an instance node"});
}

TEST_F(SysinfoList, NeedsExactlyOneKeyPerInstanceAncestor) {
    Numbers numbers = {1, 2};
    ExpectHas(KeelText([&] { Sysinfo(kDevices).List(numbers); }),
              {"node 2 \"devices\" with path []", "takes 1 instance key, 0 given"});
    ExpectHas(KeelText([&] {
                  Sysinfo s(kDevices);
                  s.AddInstancePath(100ULL);
                  s.AddInstancePath(7ULL);
                  s.List(numbers);
              }),
              {"path [100, 7]", "takes 1 instance key, 2 given"});
    ExpectHas(KeelText([&] {
                  Sysinfo s(kGroups);
                  s.AddInstancePath(100ULL);
                  s.List(numbers);
              }),
              {"node 1 \"groups\" with path [100]", "takes 0 instance keys, 1 given"});
    EXPECT_EQ(numbers, (Numbers{1, 2}));  // untouched by every failure
}

TEST_F(SysinfoList, NeedsKeysAndListOfTheRightKind) {
    Names names;
    Numbers numbers;
    ExpectHas(KeelText([&] {
                  Sysinfo s(kDevices);
                  s.AddInstancePath(std::string("100"));
                  s.List(numbers);
              }),
              {"path [\"100\"]", "key 0 (\"100\") is string", "level node 1 \"groups\" takes integer keys"});
    ExpectHas(KeelText([&] { Sysinfo(kGroups).List(names); }),
              {"node 1 \"groups\"", "takes integer keys; list them as numbers"});
    ExpectHas(KeelText([&] { Sysinfo(kByName).List(numbers); }),
              {"node 8 \"byName\"", "takes string keys; list them as strings"});
    ExpectHas(KeelText([&] {
                  Sysinfo s(kArg2);
                  s.AddInstancePath(5LL);
                  s.List(numbers);
              }),
              {"node 6 \"arg2\" with path [5]", "list them as strings"});
}

TEST_F(SysinfoList, NeedsExistingInstancesAbove) {
    Numbers numbers;
    ExpectHas(KeelText([&] {
                  Sysinfo s(kDevices);
                  s.AddInstancePath(300ULL);
                  s.List(numbers);
              }),
              {"List of sysinfo node 2 \"devices\" with path [300]",
               "key 0 (300) names no instance of node 1 \"groups\" below []"});
    // The deepest level of the chain: the missing key is the last one.
    ExpectHas(KeelText([&] {
                  Sysinfo s(kDeep);
                  for (unsigned long long k : {1, 2, 3, 4, 5, 6, 9}) {
                      s.AddInstancePath(k);
                  }
                  s.List(numbers);
              }),
              {"node 19 \"deep\" with path [1, 2, 3, 4, 5, 6, 9]", "key 6 (9) names no instance of node 18 \"lv7\""});
}

}  // namespace
