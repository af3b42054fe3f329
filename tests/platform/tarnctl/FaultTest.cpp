// Fault injection: every kind, limited and path-bound faults, their order, and their validation.
#include <stdexcept>

#include "TestTree.h"

namespace {

using namespace TarnCtlTest;
using TarnCtl::Sim::Fault;
using TarnCtl::Sim::Op;
using TarnCtl::Util::Sysinfo;

Fault MakeFault(Op op, unsigned node, Fault::Kind kind, long times = -1, std::string text = "injected fault") {
    Fault f;
    f.op = op;
    f.node = node;
    f.kind = kind;
    f.times = times;
    f.text = std::move(text);
    return f;
}

class SimTreeFaults : public TreeTest {
protected:
    // Reads the name record of device `device` in group 100 into a fresh 0xAA buffer.
    std::vector<uint8_t> ReadName(unsigned long long device) {
        std::vector<uint8_t> buf(16, 0xAA);
        Sysinfo s(kName);
        s.AddInstancePath(100ULL);
        s.AddInstancePath(device);
        s.Get(buf.data(), 16);
        return buf;
    }
};

TEST_F(SimTreeFaults, ThrowKindsCarryTheTextAndTheirType) {
    tree_->AddFault(MakeFault(Op::Get, kName, Fault::Kind::ThrowKeel, -1, "kernel said no"));
    EXPECT_EQ(KeelText([&] { ReadName(7); }), "kernel said no");
    EXPECT_EQ(KeelText([&] { ReadName(8); }), "kernel said no");  // -1: always
    tree_->ClearFaults();
    EXPECT_EQ(ReadName(7)[0], 'd');

    tree_->AddFault(MakeFault(Op::Get, kName, Fault::Kind::ThrowOther, -1, "other failure"));
    try {
        ReadName(7);
        ADD_FAILURE() << "no throw";
    } catch (const Keel::Lib::KeelException&) {
        ADD_FAILURE() << "ThrowOther must not throw a KeelException";
    } catch (const std::runtime_error& e) {
        EXPECT_STREQ(e.what(), "other failure");
    }
}

TEST_F(SimTreeFaults, CopyKindsShortenTheCopy) {
    tree_->AddFault(MakeFault(Op::Get, kName, Fault::Kind::CopyNothing, 1));
    EXPECT_EQ(ReadName(7), std::vector<uint8_t>(16, 0xAA));
    EXPECT_EQ(ReadName(7)[0], 'd');  // spent

    Fault prefix = MakeFault(Op::Get, kName, Fault::Kind::CopyPrefix, 2);
    prefix.bytes = 3;
    tree_->AddFault(prefix);
    std::vector<uint8_t> buf = ReadName(7);
    EXPECT_EQ(std::string(buf.begin(), buf.begin() + 3), "dis");
    EXPECT_EQ(buf[3], 0xAA);
    // A prefix longer than the stored record copies the record only.
    buf = ReadName(3);
    EXPECT_EQ(buf[1], 'b');
    EXPECT_EQ(buf[2], 0xAA);
}

TEST_F(SimTreeFaults, LimitedFaultsFireExactlyTheirTimes) {
    tree_->AddFault(MakeFault(Op::Get, kName, Fault::Kind::ThrowKeel, 0, "never"));
    tree_->AddFault(MakeFault(Op::Get, kName, Fault::Kind::ThrowKeel, 2, "first"));
    tree_->AddFault(MakeFault(Op::Get, kName, Fault::Kind::ThrowKeel, 1, "second"));
    // The first fault added that still has firings left fires.
    EXPECT_EQ(KeelText([&] { ReadName(7); }), "first");
    EXPECT_EQ(KeelText([&] { ReadName(8); }), "first");
    EXPECT_EQ(KeelText([&] { ReadName(7); }), "second");
    EXPECT_EQ(ReadName(7)[4], '7');
}

TEST_F(SimTreeFaults, PathBoundFaultsFireOnlyForTheirPath) {
    Fault f = MakeFault(Op::Get, kName, Fault::Kind::ThrowKeel, -1, "only disk8");
    f.anyPath = false;
    f.path = {IntKey(100), IntKey(8)};
    tree_->AddFault(f);
    EXPECT_EQ(ReadName(7)[4], '7');
    EXPECT_EQ(KeelText([&] { ReadName(8); }), "only disk8");
    EXPECT_EQ(ReadName(3)[0], 'a');
}

// A fault replaces the outcome of an operation that passed its checks: a failing call reports
// its own error and spends no firing.
TEST_F(SimTreeFaults, ChecksComeBeforeFaults) {
    tree_->AddFault(MakeFault(Op::Get, kName, Fault::Kind::ThrowKeel, 1, "spent"));
    uint8_t buf[17];
    ExpectHas(KeelText([&] {
                  Sysinfo s(kName);
                  s.AddInstancePath(100ULL);
                  s.AddInstancePath(7ULL);
                  s.Get(buf, 17);
              }),
              {"size 17 asked"});
    EXPECT_EQ(KeelText([&] { ReadName(7); }), "spent");
    EXPECT_EQ(ReadName(7)[0], 'd');
}

TEST_F(SimTreeFaults, OtherOperationsCanFail) {
    std::vector<unsigned long long> numbers;
    tree_->AddFault(MakeFault(Op::List, kDevices, Fault::Kind::ThrowKeel, 1, "list failed"));
    numbers = {1};
    EXPECT_EQ(KeelText([&] {
                  Sysinfo s(kDevices);
                  s.SetInstance(100);
                  s.List(numbers);
              }),
              "list failed");
    EXPECT_EQ(numbers, (std::vector<unsigned long long>{1}));

    tree_->AddFault(MakeFault(Op::Bind, kGroups, Fault::Kind::ThrowKeel, 1, "bind failed"));
    EXPECT_EQ(KeelText([] { Sysinfo s(kGroups); }), "bind failed");
    EXPECT_NO_THROW(Sysinfo s(kGroups));

    tree_->AddFault(MakeFault(Op::SetInstance, kDevices, Fault::Kind::ThrowOther, 1, "set failed"));
    EXPECT_THROW(Sysinfo(kDevices).SetInstance(100), std::runtime_error);

    // A failed AddInstancePath leaves the path as it was.
    Fault add = MakeFault(Op::AddInstancePath, kName, Fault::Kind::ThrowKeel, -1, "add failed");
    add.anyPath = false;
    add.path = {IntKey(100), IntKey(9)};  // the path with the new key appended
    tree_->AddFault(add);
    uint8_t buf[16];
    Sysinfo s(kName);
    s.AddInstancePath(100ULL);
    EXPECT_EQ(KeelText([&] { s.AddInstancePath(9ULL); }), "add failed");
    s.AddInstancePath(8ULL);
    s.Get(buf, 16);
    EXPECT_EQ(buf[4], '8');
}

TEST_F(SimTreeFaults, BadFaultsAreRefused) {
    EXPECT_THROW(tree_->AddFault(MakeFault(Op::List, kDevices, Fault::Kind::CopyNothing)), std::invalid_argument);
    EXPECT_THROW(tree_->AddFault(MakeFault(Op::Bind, kName, Fault::Kind::CopyPrefix)), std::invalid_argument);
    EXPECT_THROW(tree_->AddFault(MakeFault(Op::Get, kNodeCount, Fault::Kind::ThrowKeel)), std::invalid_argument);
    EXPECT_THROW(tree_->AddFault(MakeFault(Op::Get, kName, Fault::Kind::ThrowKeel, -2)), std::invalid_argument);
    EXPECT_EQ(ReadName(7)[0], 'd');  // nothing was added
}

}  // namespace
