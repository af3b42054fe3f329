// Concurrent readers of one installed tree: results, counters and limited faults stay exact.
#include <atomic>
#include <thread>

#include "TestTree.h"

namespace {

using namespace TarnCtlTest;
using TarnCtl::Sim::Fault;
using TarnCtl::Sim::Op;
using TarnCtl::Util::Sysinfo;

using SimTreeConcurrency = TreeTest;

TEST_F(SimTreeConcurrency, ManyReadersSeeTheSameTree) {
    constexpr int kThreads = 4;
    constexpr int kRounds = 2000;
    constexpr long kFaultTimes = 37;
    Fault f;
    f.op = Op::Get;
    f.node = kArg2;
    f.times = kFaultTimes;
    f.text = "limited";
    tree_->AddFault(f);

    std::atomic<long> faultsSeen{0};
    std::atomic<long> wrong{0};
    auto reader = [&] {
        std::vector<std::string> names;
        std::vector<uint8_t> buf(36);
        for (int round = 0; round < kRounds; ++round) {
            Sysinfo list(kArg2);
            list.AddInstancePath(5LL);
            list.List(names);
            if (names != std::vector<std::string>{"naa.1", "naa.0"}) {
                ++wrong;
            }
            for (const std::string& n : names) {
                Sysinfo get(kArg2);
                get.AddInstancePath(5LL);
                get.AddInstancePath(n);
                try {
                    get.Get(buf.data(), 36);
                    if (buf[35] != (n == "naa.1" ? 0x11 : 0x22)) {
                        ++wrong;
                    }
                } catch (const Keel::Lib::KeelException& e) {
                    faultsSeen += e.GetMessage(0) == "limited" ? 1 : 1000000;
                }
            }
        }
    };
    std::vector<std::thread> threads;
    for (int i = 0; i < kThreads; ++i) {
        threads.emplace_back(reader);
    }
    for (auto& t : threads) {
        t.join();
    }
    EXPECT_EQ(wrong.load(), 0);
    EXPECT_EQ(faultsSeen.load(), kFaultTimes);
    const auto c = tree_->NodeCounters(kArg2);
    EXPECT_EQ(c.binds, static_cast<uint64_t>(kThreads * kRounds * 3));
    EXPECT_EQ(c.lists, static_cast<uint64_t>(kThreads * kRounds));
    EXPECT_EQ(c.gets, static_cast<uint64_t>(kThreads * kRounds * 2));
}

}  // namespace
