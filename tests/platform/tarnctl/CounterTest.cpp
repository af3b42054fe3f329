// Counters of binds, lists and gets per node.
#include "TestTree.h"

namespace {

using namespace TarnCtlTest;
using TarnCtl::Sim::Counters;
using TarnCtl::Util::Sysinfo;

using SimTreeCounters = TreeTest;

TEST_F(SimTreeCounters, CountEveryCallPerNodeWhateverItsOutcome) {
    std::vector<unsigned long long> numbers;
    std::vector<std::string> names;
    uint8_t buf[16];
    {
        Sysinfo devices(kDevices);
        devices.SetInstance(100);
        devices.List(numbers);
        devices.List(numbers);
        EXPECT_THROW(devices.List(names), Keel::Lib::KeelException);  // wrong kind: still a list call
    }
    {
        Sysinfo name(kName);
        name.AddInstancePath(100ULL);
        name.AddInstancePath(7ULL);
        name.Get(buf, 16);
        EXPECT_THROW(name.Get(buf, 15), Keel::Lib::KeelException);
    }
    EXPECT_THROW(Sysinfo s(kNodeCount), Keel::Lib::KeelException);  // out of range: counted nowhere

    const Counters d = tree_->NodeCounters(kDevices);
    EXPECT_EQ(d.binds, 1u);
    EXPECT_EQ(d.lists, 3u);
    EXPECT_EQ(d.gets, 0u);
    const Counters n = tree_->NodeCounters(kName);
    EXPECT_EQ(n.binds, 1u);
    EXPECT_EQ(n.lists, 0u);
    EXPECT_EQ(n.gets, 2u);

    const Counters total = tree_->TotalCounters();
    EXPECT_EQ(total.binds, 2u);
    EXPECT_EQ(total.lists, 3u);
    EXPECT_EQ(total.gets, 2u);

    tree_->ResetCounters();
    const Counters zero = tree_->TotalCounters();
    EXPECT_EQ(zero.binds + zero.lists + zero.gets, 0u);
}

}  // namespace
