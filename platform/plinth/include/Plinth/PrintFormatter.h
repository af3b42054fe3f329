// One message argument with its formatting function.
//
// FormatInt (signed 32-bit), FormatUInt (unsigned 32-bit), FormatULong (unsigned 64-bit) and
// FormatSTLString (string) capture a value; Append writes its text. A string argument refers to
// the caller's string, which must outlive the formatter (a message call's full expression).
#pragma once

#include <atomic>
#include <cstdint>
#include <string>

namespace Plinth {

class PrintFormatter {
public:
    static PrintFormatter FormatInt(int32_t value);
    static PrintFormatter FormatUInt(uint32_t value);
    static PrintFormatter FormatULong(uint64_t value);
    static PrintFormatter FormatSTLString(const std::string& value);

    void Append(std::string& out) const;

    // Number of Append calls in the process, so tests can tell whether arguments were formatted.
    static unsigned long FormatCount() noexcept;

private:
    using Function = void (*)(const PrintFormatter&, std::string&);
    PrintFormatter(Function fn) : fn_(fn) {}
    Function fn_;
    union {
        int32_t i32;
        uint32_t u32;
        uint64_t u64;
        const std::string* str;
    } value_{};
};

}  // namespace Plinth
