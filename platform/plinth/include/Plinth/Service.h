// The application object, its logging service and named loggers.
//
// GetApp() returns the process's application object. Its logging service hands out one Logger per
// name (the same object for the same name). Each logger carries a 32-bit word of enabled levels,
// which the application sets; a message at level L is meant to be written when the word has a bit
// of L | (L << 16) set (callers test the gate before building arguments). LogInternal formats a
// message, replacing %1..%3 with the arguments, and hands (logger name, level, text) to the sink:
// by default one line on stderr. Sinks are called one at a time.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <mutex>
#include <string>

#include "Plinth/Object.h"
#include "Plinth/PrintFormatter.h"
#include "Plinth/Ref.h"

namespace Plinth {
namespace Service {

class Logger : public ObjectImpl {
public:
    enum LogLevel : uint32_t {
        LOG_ERROR = 4,
        LOG_WARNING = 8,
        LOG_INFO = 16,
        LOG_VERBOSE = 32,
        LOG_TRACE = 64,
    };

    explicit Logger(std::string name, uint32_t levels);
    const std::string& GetName() const noexcept { return name_; }
    uint32_t GetLevels() const noexcept { return levels_.load(std::memory_order_relaxed); }
    void SetLevels(uint32_t levels) noexcept { levels_.store(levels, std::memory_order_relaxed); }
    // True when the level word has a bit of level | (level << 16) set.
    bool IsEnabled(uint32_t level) const noexcept { return (GetLevels() & (level | (level << 16))) != 0; }

private:
    std::string name_;
    std::atomic<uint32_t> levels_;
};

using LogSink = std::function<void(const std::string& logger, uint32_t level, const std::string& text)>;

class LogService : public ObjectImpl {
public:
    // Stores the logger of that name in `out`, creating it with the default level word.
    void GetLogger(const std::string& name, Ref<Logger>& out);
    // Level word given to loggers created from now on (existing ones keep theirs).
    void SetDefaultLevels(uint32_t levels);
    // Sets the level word of every logger, existing and future.
    void SetAllLevels(uint32_t levels);
    // Replaces the sink; an empty function restores the stderr sink.
    void SetSink(LogSink sink);
    void Write(const Logger& logger, uint32_t level, const std::string& text);

private:
    std::mutex mutex_;
    std::map<std::string, Ref<Logger>> loggers_;
    uint32_t defaultLevels_ = Logger::LOG_ERROR | Logger::LOG_WARNING;
    LogSink sink_;
};

class App : public ObjectImpl {
public:
    App();
    LogService* GetLogService() const noexcept { return logService_.Get(); }

private:
    Ref<LogService> logService_;
};

// The application object; it lives until the process ends.
App* GetApp();

void LogInternal(Logger* logger, Logger::LogLevel level, char const* format);
void LogInternal(Logger* logger, Logger::LogLevel level, char const* format, PrintFormatter const& a1);
void LogInternal(Logger* logger, Logger::LogLevel level, char const* format, PrintFormatter const& a1,
                 PrintFormatter const& a2);
void LogInternal(Logger* logger, Logger::LogLevel level, char const* format, PrintFormatter const& a1,
                 PrintFormatter const& a2, PrintFormatter const& a3);

}  // namespace Service
}  // namespace Plinth
