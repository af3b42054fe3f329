// Decoding of sysinfo records through the exported type, member and element tables.
//
// DecodeRecord walks a record of a given type and yields one (label, text) pair per scalar value:
// structures by their members (label "a.b"), arrays by their elements (label "a[3]"), except that
// an array of KEL_STRING characters is one string (quoted, cut at the first NUL, bytes outside
// 0x20-0x7e written \xNN). Scalars are written with their type's print format (the C conversions
// d i u x X o c s, with flags, width, precision and any length modifier, applied to the value's
// own size, signed for d and i); enumerations by the display text of their element, flag sets as
// the texts of their set bits joined by '|' (a remainder in hexadecimal), an unknown value in
// decimal. Trailing blanks of a formatted value are dropped.
//
// Guarantees: reads no byte outside [bytes, bytes + size): a value reaching past the end is
// given as "(beyond the record)". Recursion is bounded by the type graph, which has no cycles.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "tarnstats/SysinfoSchema.h"

namespace Tool {

using DecodedField = std::pair<std::string, std::string>;

// `label` names the whole record (used as is for a record that is not a structure).
std::vector<DecodedField> DecodeRecord(const StatsRegistry::KelTypeDef& type, const uint8_t* bytes, std::size_t size,
                                       const std::string& label);

// One scalar of `size` bytes (1, 2, 4 or 8; others are written in hexadecimal bytes) at `bytes`,
// written with the C print format `format`.
std::string FormatScalar(const char* format, std::size_t size, const uint8_t* bytes);

}  // namespace Tool
