// Where each value of a JSON text stands: line and column by JSON pointer.
//
// IndexJsonPositions scans a text that a strict JSON parser has already accepted and records,
// for every value, the position of its first byte and, for object members, the position of the
// member's key. Pointers are RFC 6901 texts ("" for the whole document, "/vms/0/worldId"), built
// with PointerChild so that callers walking a parsed document build the same texts.
//
// Guarantees: lines and columns are 1-based; columns count bytes. Duplicate member names are
// reported, not indexed (a parser keeps only one of them, so the text would be ambiguous).
// Throws: JsonPositionError for a duplicate member name or nesting deeper than kMaxDepth, with
// the position of the offending key or value. REQUIRES: the text is valid JSON (otherwise the
// index is incomplete, never out of bounds).
#pragma once

#include <cstddef>
#include <map>
#include <stdexcept>
#include <string>
#include <utility>

namespace HostSim {

struct TextPosition {
    std::size_t line = 1;
    std::size_t column = 1;
};

// Line and column of byte `offset` of `text` (an offset at or past the end gives the position
// just after the last byte).
TextPosition PositionOf(const std::string& text, std::size_t offset);

struct JsonPlace {
    TextPosition value;  // first byte of the value
    TextPosition key;    // first byte of the member's key; the value's position for array elements
};

class JsonPositionError : public std::runtime_error {
public:
    JsonPositionError(TextPosition where, std::string pointer, const std::string& message)
        : std::runtime_error(message), where_(where), pointer_(std::move(pointer)) {}
    TextPosition Where() const noexcept { return where_; }
    const std::string& Pointer() const noexcept { return pointer_; }

private:
    TextPosition where_;
    std::string pointer_;
};

class JsonPositions {
public:
    static constexpr unsigned kMaxDepth = 64;

    // The place of the value at `pointer`; the document's start when the pointer is unknown.
    JsonPlace At(const std::string& pointer) const;
    void Add(std::string pointer, JsonPlace place) { places_.emplace(std::move(pointer), place); }

private:
    std::map<std::string, JsonPlace> places_;
};

// The pointer of a member or an element below `parent`: PointerChild("", "a/b") is "/a~1b"
// ('~' is written "~0", '/' "~1"); PointerChild("/vms", 3) is "/vms/3".
std::string PointerChild(const std::string& parent, const std::string& member);
std::string PointerChild(const std::string& parent, std::size_t index);

// THROWS JsonPositionError (see above).
JsonPositions IndexJsonPositions(const std::string& text);

}  // namespace HostSim
