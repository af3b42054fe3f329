#include "Plinth/Service.h"

#include <cstdio>

namespace Plinth {
namespace Service {

Logger::Logger(std::string name, uint32_t levels) : name_(std::move(name)), levels_(levels) {}

void LogService::GetLogger(const std::string& name, Ref<Logger>& out) {
    std::lock_guard<std::mutex> lock(mutex_);
    auto it = loggers_.find(name);
    if (it == loggers_.end()) {
        it = loggers_.emplace(name, Ref<Logger>(new Logger(name, defaultLevels_))).first;
    }
    out = it->second;
}

void LogService::SetDefaultLevels(uint32_t levels) {
    std::lock_guard<std::mutex> lock(mutex_);
    defaultLevels_ = levels;
}

void LogService::SetAllLevels(uint32_t levels) {
    std::lock_guard<std::mutex> lock(mutex_);
    defaultLevels_ = levels;
    for (auto& entry : loggers_) entry.second->SetLevels(levels);
}

void LogService::SetSink(LogSink sink) {
    std::lock_guard<std::mutex> lock(mutex_);
    sink_ = std::move(sink);
}

void LogService::Write(const Logger& logger, uint32_t level, const std::string& text) {
    std::lock_guard<std::mutex> lock(mutex_);
    if (sink_) {
        sink_(logger.GetName(), level, text);
    } else {
        std::fprintf(stderr, "%s [%u] %s\n", logger.GetName().c_str(), static_cast<unsigned>(level), text.c_str());
    }
}

App::App() : logService_(new LogService) {}

App* GetApp() {
    // Never destroyed: loggers may be used from static destructors of other libraries.
    static App* app = [] {
        App* created = new App;
        created->IncRef();
        return created;
    }();
    return app;
}

namespace {

// Replaces %1..%3 with the arguments; any other '%' sequence is copied as it stands.
void Emit(Logger* logger, Logger::LogLevel level, char const* format, PrintFormatter const* const* args,
          unsigned count) {
    if (logger == nullptr || format == nullptr) return;
    std::string text;
    for (const char* p = format; *p != '\0'; ++p) {
        if (p[0] == '%' && p[1] >= '1' && p[1] <= '3' && static_cast<unsigned>(p[1] - '1') < count) {
            args[p[1] - '1']->Append(text);
            ++p;
        } else {
            text += *p;
        }
    }
    GetApp()->GetLogService()->Write(*logger, level, text);
}

}  // namespace

void LogInternal(Logger* logger, Logger::LogLevel level, char const* format) { Emit(logger, level, format, nullptr, 0); }

void LogInternal(Logger* logger, Logger::LogLevel level, char const* format, PrintFormatter const& a1) {
    PrintFormatter const* args[] = {&a1};
    Emit(logger, level, format, args, 1);
}

void LogInternal(Logger* logger, Logger::LogLevel level, char const* format, PrintFormatter const& a1,
                 PrintFormatter const& a2) {
    PrintFormatter const* args[] = {&a1, &a2};
    Emit(logger, level, format, args, 2);
}

void LogInternal(Logger* logger, Logger::LogLevel level, char const* format, PrintFormatter const& a1,
                 PrintFormatter const& a2, PrintFormatter const& a3) {
    PrintFormatter const* args[] = {&a1, &a2, &a3};
    Emit(logger, level, format, args, 3);
}

}  // namespace Service
}  // namespace Plinth
