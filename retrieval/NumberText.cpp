#include "retrieval/NumberText.h"

namespace StatsRegistry {
namespace NumberText {
namespace {

bool IsSpace(char c) noexcept { return c == ' ' || (c >= '\t' && c <= '\r'); }

// Skips white space and reads the sign and magnitude. Fails when no digit follows the sign or the
// magnitude exceeds 2^64 - 1.
bool ReadMagnitude(const std::string& text, bool& negative, unsigned long long& magnitude) noexcept {
    size_t i = 0;
    const size_t n = text.size();
    while (i < n && IsSpace(text[i])) ++i;
    negative = false;
    if (i < n && (text[i] == '+' || text[i] == '-')) {
        negative = text[i] == '-';
        ++i;
    }
    if (i >= n || text[i] < '0' || text[i] > '9') return false;
    unsigned long long result = 0;
    bool overflow = false;
    for (; i < n && text[i] >= '0' && text[i] <= '9'; ++i) {
        const unsigned digit = static_cast<unsigned>(text[i] - '0');
        if (result > (~0ull - digit) / 10) overflow = true;
        result = result * 10 + digit;  // wraps only when overflow is already set
    }
    if (overflow) return false;
    magnitude = result;
    return true;
}

}  // namespace

bool ParseSigned64(const std::string& text, long long& value) noexcept {
    bool negative = false;
    unsigned long long magnitude = 0;
    if (!ReadMagnitude(text, negative, magnitude)) return false;
    constexpr unsigned long long kMax = 9223372036854775807ull;
    if (negative) {
        if (magnitude > kMax + 1) return false;
        value = magnitude == kMax + 1 ? (-9223372036854775807ll - 1) : -static_cast<long long>(magnitude);
    } else {
        if (magnitude > kMax) return false;
        value = static_cast<long long>(magnitude);
    }
    return true;
}

bool ParseUnsigned64(const std::string& text, unsigned long long& value) noexcept {
    bool negative = false;
    unsigned long long magnitude = 0;
    if (!ReadMagnitude(text, negative, magnitude)) return false;
    value = negative ? (0ull - magnitude) : magnitude;
    return true;
}

void AppendUnsigned64(std::string& out, unsigned long long value) {
    char digits[20];
    int n = 0;
    do {
        digits[n++] = static_cast<char>('0' + value % 10);
        value /= 10;
    } while (value != 0);
    while (n > 0) out += digits[--n];
}

std::string FormatUnsigned64(unsigned long long value) {
    std::string out;
    AppendUnsigned64(out, value);
    return out;
}

}  // namespace NumberText
}  // namespace StatsRegistry
