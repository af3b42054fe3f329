// Decimal number texts of instance strings, with the semantics of formatted stream extraction and
// insertion in the classic locale, without building a stream.
//
// ParseSigned64 reads like `std::istringstream(text) >> long long` (base 10): leading white space
// is skipped, one optional '+' or '-', then decimal digits as far as they go; the rest is ignored.
// It fails when no digit follows or the value lies outside the signed 64-bit range.
// ParseUnsigned64 reads like `>> unsigned long long`: the same, except that a '-' sign negates the
// value modulo 2^64 (so "-1" gives 18446744073709551615), and only a magnitude above 2^64 - 1 fails.
// On failure the output is left unchanged. Neither allocates.
// FormatUnsigned64 writes the decimal text with no sign, no leading zeros and no grouping.
#pragma once

#include <cstdint>
#include <string>

namespace StatsRegistry {
namespace NumberText {

bool ParseSigned64(const std::string& text, long long& value) noexcept;
bool ParseUnsigned64(const std::string& text, unsigned long long& value) noexcept;
std::string FormatUnsigned64(unsigned long long value);
// Appends the decimal text of `value` to `out`.
void AppendUnsigned64(std::string& out, unsigned long long value);

}  // namespace NumberText
}  // namespace StatsRegistry
