// The one way the library writes a message: the level gate in front of the core object library's
// LogInternal.
//
// Log(logger, level, format, args...) tests the logger's level word against
// level | (level << 16) and returns at once when no bit is set: the arguments are then never
// converted to PrintFormatter objects and nothing is formatted. Arguments are typed wrappers
// (Int: signed 32-bit, UInt: unsigned 32-bit, ULong: unsigned 64-bit, Str: string by reference),
// so that each message states the argument types it uses. A null logger writes nothing.
// THROWS whatever the logging service throws (allocation failures while formatting).
#pragma once

#include <cstdint>
#include <string>

#include "Plinth/PrintFormatter.h"
#include "Plinth/Service.h"

namespace StatsRegistry {
namespace Log {

using Level = Plinth::Service::Logger::LogLevel;
constexpr Level kError = Plinth::Service::Logger::LOG_ERROR;      // 4
constexpr Level kWarning = Plinth::Service::Logger::LOG_WARNING;  // 8
constexpr Level kTrace = Plinth::Service::Logger::LOG_TRACE;      // 64

struct Int {
    int32_t value;
};
struct UInt {
    uint32_t value;
};
struct ULong {
    uint64_t value;
};
struct Str {
    const std::string& value;
};

inline Plinth::PrintFormatter Format(Int a) { return Plinth::PrintFormatter::FormatInt(a.value); }
inline Plinth::PrintFormatter Format(UInt a) { return Plinth::PrintFormatter::FormatUInt(a.value); }
inline Plinth::PrintFormatter Format(ULong a) { return Plinth::PrintFormatter::FormatULong(a.value); }
inline Plinth::PrintFormatter Format(Str a) { return Plinth::PrintFormatter::FormatSTLString(a.value); }

inline bool Enabled(const Plinth::Service::Logger* logger, Level level) noexcept {
    const uint32_t mask = static_cast<uint32_t>(level) | (static_cast<uint32_t>(level) << 16);
    return logger != nullptr && (logger->GetLevels() & mask) != 0;
}

template <typename... Args>
void Write(Plinth::Service::Logger* logger, Level level, const char* format, Args... args) {
    static_assert(sizeof...(Args) <= 3, "a message takes at most three arguments");
    if (!Enabled(logger, level)) return;
    Plinth::Service::LogInternal(logger, level, format, Format(args)...);
}

}  // namespace Log
}  // namespace StatsRegistry
