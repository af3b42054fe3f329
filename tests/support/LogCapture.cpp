#include "LogCapture.h"

#include "Plinth/Service.h"

namespace TestSupport {

LogCapture::LogCapture(uint32_t levels) {
    auto* service = Plinth::Service::GetApp()->GetLogService();
    service->SetSink([this](const std::string& logger, uint32_t level, const std::string& text) {
        std::lock_guard<std::mutex> lock(mutex_);
        entries_.push_back(LogEntry{logger, level, text});
    });
    service->SetAllLevels(levels);
}

LogCapture::~LogCapture() {
    auto* service = Plinth::Service::GetApp()->GetLogService();
    service->SetSink({});
    service->SetAllLevels(Plinth::Service::Logger::LOG_ERROR | Plinth::Service::Logger::LOG_WARNING);
}

std::vector<LogEntry> LogCapture::Entries() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return entries_;
}

std::vector<std::string> LogCapture::Texts(uint32_t level) const {
    std::lock_guard<std::mutex> lock(mutex_);
    std::vector<std::string> out;
    for (const auto& e : entries_) {
        if (level == 0 || e.level == level) out.push_back(e.text);
    }
    return out;
}

void LogCapture::Clear() {
    std::lock_guard<std::mutex> lock(mutex_);
    entries_.clear();
}

void LogCapture::SetLevels(uint32_t levels) { Plinth::Service::GetApp()->GetLogService()->SetAllLevels(levels); }

std::string ToString(const std::vector<LogEntry>& entries) {
    std::string out;
    for (const auto& e : entries) out += e.logger + " [" + std::to_string(e.level) + "] " + e.text + "\n";
    return out;
}

}  // namespace TestSupport
