// Test helper: captures every message of the process's logging service while it lives.
//
// On construction it installs a capturing sink and sets every logger's level word to `levels`
// (all levels by default); on destruction it restores the stderr sink and the default word 4|8.
// Messages are kept as (logger, level, text). Thread-safe (the service serialises sink calls).
#pragma once

#include <cstdint>
#include <mutex>
#include <ostream>
#include <string>
#include <vector>

namespace TestSupport {

struct LogEntry {
    std::string logger;
    uint32_t level;
    std::string text;
    bool operator==(const LogEntry& o) const { return logger == o.logger && level == o.level && text == o.text; }
};

class LogCapture {
public:
    static constexpr uint32_t kAllLevels = 0xffffffffu;
    explicit LogCapture(uint32_t levels = kAllLevels);
    ~LogCapture();
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;

    std::vector<LogEntry> Entries() const;
    // Texts of the messages at `level` (all levels when 0).
    std::vector<std::string> Texts(uint32_t level = 0) const;
    void Clear();
    void SetLevels(uint32_t levels);

private:
    mutable std::mutex mutex_;
    std::vector<LogEntry> entries_;
};

std::string ToString(const std::vector<LogEntry>& entries);
inline void PrintTo(const LogEntry& e, std::ostream* os) { *os << e.logger << " [" << e.level << "] " << e.text; }

}  // namespace TestSupport
