#include <gtest/gtest.h>

#include <string>
#include <tuple>
#include <vector>

#include "Plinth/Service.h"

namespace {

using Plinth::PrintFormatter;
using Plinth::Service::Logger;
using Entry = std::tuple<std::string, uint32_t, std::string>;

class Logging : public ::testing::Test {
protected:
    void SetUp() override {
        service()->SetSink([this](const std::string& l, uint32_t level, const std::string& text) {
            entries.emplace_back(l, level, text);
        });
        service()->GetLogger("LoggingTest", logger);
        logger->SetLevels(0xffffffffu);
    }
    void TearDown() override { service()->SetSink({}); }
    static Plinth::Service::LogService* service() { return Plinth::Service::GetApp()->GetLogService(); }

    Plinth::Ref<Logger> logger;
    std::vector<Entry> entries;
};

TEST_F(Logging, OneLoggerPerNameWithItsOwnLevelWord) {
    Plinth::Ref<Logger> again, other;
    service()->GetLogger("LoggingTest", again);
    service()->GetLogger("LoggingTestOther", other);
    EXPECT_EQ(again.Get(), logger.Get());
    EXPECT_NE(other.Get(), logger.Get());
    EXPECT_EQ(other->GetName(), "LoggingTestOther");
    other->SetLevels(0);
    EXPECT_EQ(logger->GetLevels(), 0xffffffffu);
}

TEST_F(Logging, ArgumentsReplacePlaceholdersInOrder) {
    std::string text = "disk1";
    Plinth::Service::LogInternal(logger.Get(), Logger::LOG_WARNING, "no argument %1");
    Plinth::Service::LogInternal(logger.Get(), Logger::LOG_WARNING, "one %1.", PrintFormatter::FormatInt(-5));
    Plinth::Service::LogInternal(logger.Get(), Logger::LOG_ERROR, "%2 then %1", PrintFormatter::FormatUInt(4294967295u),
                                 PrintFormatter::FormatSTLString(text));
    Plinth::Service::LogInternal(logger.Get(), Logger::LOG_TRACE, "(%1:%2): %3 %4 100%",
                                 PrintFormatter::FormatULong(18446744073709551615ull),
                                 PrintFormatter::FormatSTLString(text), PrintFormatter::FormatInt(0));
    ASSERT_EQ(entries.size(), 4u);
    EXPECT_EQ(entries[0], Entry("LoggingTest", 8, "no argument %1"));
    EXPECT_EQ(entries[1], Entry("LoggingTest", 8, "one -5."));
    EXPECT_EQ(entries[2], Entry("LoggingTest", 4, "disk1 then 4294967295"));
    EXPECT_EQ(entries[3], Entry("LoggingTest", 64, "(18446744073709551615:disk1): 0 %4 100%"));
}

TEST_F(Logging, LevelWordMasks) {
    struct Case {
        uint32_t word;
        bool l4, l8, l64;
    } cases[] = {
        {0x40004, true, false, false}, {0x80008, false, true, false}, {0x400040, false, false, true},
        {0x4, true, false, false},     {0x80000, false, true, false}, {0, false, false, false},
        {0x10, false, false, false},
    };
    for (const auto& c : cases) {
        logger->SetLevels(c.word);
        EXPECT_EQ(logger->IsEnabled(4), c.l4) << std::hex << c.word;
        EXPECT_EQ(logger->IsEnabled(8), c.l8) << std::hex << c.word;
        EXPECT_EQ(logger->IsEnabled(64), c.l64) << std::hex << c.word;
    }
}

TEST_F(Logging, DefaultAndAllLevels) {
    service()->SetDefaultLevels(0x40);
    Plinth::Ref<Logger> fresh;
    service()->GetLogger("LoggingTestFresh", fresh);
    EXPECT_EQ(fresh->GetLevels(), 0x40u);
    service()->SetAllLevels(0x8);
    EXPECT_EQ(fresh->GetLevels(), 0x8u);
    EXPECT_EQ(logger->GetLevels(), 0x8u);
    service()->SetAllLevels(Logger::LOG_ERROR | Logger::LOG_WARNING);
}

}  // namespace
