#include <gtest/gtest.h>

#include "LogCapture.h"
#include "platform/LogGate.h"

namespace {

using namespace StatsRegistry;

class LogGate : public ::testing::Test {
protected:
    void SetUp() override { Plinth::Service::GetApp()->GetLogService()->GetLogger("LogGateTest", logger); }
    Plinth::Ref<Plinth::Service::Logger> logger;
};

TEST_F(LogGate, ClosedLevelFormatsNothing) {
    TestSupport::LogCapture capture(0);
    std::string text = "x";
    const unsigned long before = Plinth::PrintFormatter::FormatCount();
    Log::Write(logger.Get(), Log::kWarning, "failed to convert %1 to int", Log::Str{text});
    Log::Write(logger.Get(), Log::kError, "failed to allocate SR GetStruct");
    Log::Write(logger.Get(), Log::kTrace, "attr list count %1", Log::UInt{3});
    EXPECT_EQ(Plinth::PrintFormatter::FormatCount(), before);
    EXPECT_TRUE(capture.Entries().empty());
}

TEST_F(LogGate, EachMaskOpensItsLevelOnly) {
    struct Case {
        uint32_t word;
        Log::Level open;
    } cases[] = {{0x40004, Log::kError}, {0x80008, Log::kWarning}, {0x400040, Log::kTrace},
                 {0x40000, Log::kError}, {0x8, Log::kWarning},     {0x400000, Log::kTrace}};
    for (const auto& c : cases) {
        TestSupport::LogCapture capture(c.word);
        for (Log::Level level : {Log::kError, Log::kWarning, Log::kTrace}) {
            Log::Write(logger.Get(), level, "m %1", Log::Int{static_cast<int32_t>(level)});
        }
        auto entries = capture.Entries();
        ASSERT_EQ(entries.size(), 1u) << std::hex << c.word;
        EXPECT_EQ(entries[0].level, static_cast<uint32_t>(c.open));
        EXPECT_EQ(entries[0].text, "m " + std::to_string(c.open));
        EXPECT_EQ(entries[0].logger, "LogGateTest");
    }
}

TEST_F(LogGate, ArgumentTypesFormatAsDeclared) {
    TestSupport::LogCapture capture;
    std::string name = "vmhba1";
    Log::Write(logger.Get(), Log::kWarning, "%1 %2 %3", Log::UInt{static_cast<uint32_t>(-1)}, Log::Int{-1},
               Log::ULong{~0ull});
    Log::Write(logger.Get(), Log::kWarning, "(%1:%2)", Log::ULong{7}, Log::Str{name});
    Log::Write(nullptr, Log::kWarning, "dropped");
    EXPECT_EQ(capture.Texts(), (std::vector<std::string>{"4294967295 -1 18446744073709551615", "(7:vmhba1)"}));
}

}  // namespace
