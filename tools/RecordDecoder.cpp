#include "tools/RecordDecoder.h"

#include <cctype>
#include <cstdio>
#include <cstring>

namespace Tool {
namespace {

using StatsRegistry::KelTypeDef;

uint64_t ReadUnsigned(const uint8_t* bytes, std::size_t size) {
    uint64_t v = 0;
    for (std::size_t i = size; i-- > 0;) v = (v << 8) | bytes[i];
    return v;
}

int64_t SignExtend(uint64_t raw, std::size_t size) {
    if (size >= 8) return static_cast<int64_t>(raw);
    const uint64_t sign = uint64_t{1} << (8 * size - 1);
    return static_cast<int64_t>((raw ^ sign) - sign);
}

std::string Literal(const std::string& text) {
    std::string out;
    for (std::size_t i = 0; i < text.size(); ++i) {
        out += text[i];
        if (text[i] == '%' && i + 1 < text.size() && text[i + 1] == '%') ++i;
    }
    return out;
}

std::string Hex(const uint8_t* bytes, std::size_t size) {
    std::string out = "0x";
    char digits[3];
    for (std::size_t i = size; i-- > 0;) {
        std::snprintf(digits, sizeof digits, "%02x", bytes[i]);
        out += digits;
    }
    return out;
}

std::string QuotedString(const uint8_t* bytes, std::size_t size) {
    std::string out = "\"";
    for (std::size_t i = 0; i < size && bytes[i] != 0; ++i) {
        const uint8_t c = bytes[i];
        if (c == '"' || c == '\\') {
            out += '\\';
            out += static_cast<char>(c);
        } else if (c >= 0x20 && c <= 0x7e) {
            out += static_cast<char>(c);
        } else {
            char esc[5];
            std::snprintf(esc, sizeof esc, "\\x%02x", c);
            out += esc;
        }
    }
    return out + "\"";
}

bool IsCharacter(const KelTypeDef& t) {
    return t.kind == StatsRegistry::KEL_KIND_SCALAR && t.size == 1 && t.format != nullptr && std::strcmp(t.format, "%s") == 0;
}

std::string EnumValueText(const KelTypeDef& t, int64_t value) {
    const auto* elements = t.elemIndexOrTable.elements;
    const uintptr_t count = elements ? t.elemTypeOrCount.count : 0;
    for (uintptr_t i = 0; i < count; ++i) {
        if (elements[i].value == value) return elements[i].text;
    }
    if (!t.isFlagSet || value == 0) return std::to_string(value);
    uint64_t rest = static_cast<uint64_t>(value);
    std::string out;
    for (uintptr_t i = 0; i < count; ++i) {
        const uint64_t bits = static_cast<uint32_t>(elements[i].value);
        if (bits != 0 && (rest & bits) == bits) {
            out += (out.empty() ? "" : "|") + std::string(elements[i].text);
            rest &= ~bits;
        }
    }
    if (rest != 0) {
        char hex[24];
        std::snprintf(hex, sizeof hex, "0x%llx", static_cast<unsigned long long>(rest));
        out += (out.empty() ? "" : "|") + std::string(hex);
    }
    return out;
}

class Decoder {
public:
    Decoder(const uint8_t* bytes, std::size_t size) : bytes_(bytes), size_(size) {}

    void Decode(const KelTypeDef& t, std::size_t offset, const std::string& label) {
        // Structures and arrays are walked member by member; each value checks its own bytes.
        const bool composite = t.kind == StatsRegistry::KEL_KIND_STRUCT ||
                               (t.kind == StatsRegistry::KEL_KIND_ARRAY && t.elemTypeOrCount.elemType != nullptr &&
                                !IsCharacter(*t.elemTypeOrCount.elemType));
        if (!composite && (offset > size_ || t.size > size_ - offset)) {
            out_.emplace_back(label, "(beyond the record)");
            return;
        }
        const uint8_t* at = composite ? nullptr : bytes_ + offset;
        switch (t.kind) {
            case StatsRegistry::KEL_KIND_SCALAR: out_.emplace_back(label, FormatScalar(t.format, t.size, at)); break;
            case StatsRegistry::KEL_KIND_ENUM: {
                const std::size_t width = t.size > 8 ? 8 : t.size;
                out_.emplace_back(label, EnumValueText(t, SignExtend(ReadUnsigned(at, width), width)));
                break;
            }
            case StatsRegistry::KEL_KIND_STRUCT: {
                const auto* fields = t.elemIndexOrTable.fields;
                const uintptr_t count = fields ? t.elemTypeOrCount.count : 0;
                for (uintptr_t i = 0; i < count; ++i) {
                    const std::string child = label.empty() ? fields[i].name : label + "." + fields[i].name;
                    Decode(*fields[i].typeDef, offset + fields[i].offset, child);
                }
                break;
            }
            case StatsRegistry::KEL_KIND_ARRAY: {
                const KelTypeDef* elem = t.elemTypeOrCount.elemType;
                if (elem == nullptr) break;
                if (IsCharacter(*elem)) {
                    out_.emplace_back(label, QuotedString(at, t.size));
                    break;
                }
                if (elem->size == 0) break;
                for (std::size_t i = 0; i < t.size / elem->size; ++i) {
                    Decode(*elem, offset + i * elem->size, label + "[" + std::to_string(i) + "]");
                }
                break;
            }
            default: out_.emplace_back(label, Hex(at, t.size)); break;
        }
    }

    std::vector<DecodedField> Take() { return std::move(out_); }

private:
    const uint8_t* bytes_;
    std::size_t size_;
    std::vector<DecodedField> out_;
};

}  // namespace

std::string FormatScalar(const char* format, std::size_t size, const uint8_t* bytes) {
    if (size != 1 && size != 2 && size != 4 && size != 8) return Hex(bytes, size);
    const uint64_t raw = ReadUnsigned(bytes, size);
    const std::string f = format ? format : "%u";
    std::size_t start = 0;
    while ((start = f.find('%', start)) != std::string::npos && start + 1 < f.size() && f[start + 1] == '%') start += 2;
    if (start == std::string::npos || start + 1 >= f.size()) return Literal(f) + std::to_string(raw);
    std::size_t i = start + 1;
    std::string conversion = "%";
    while (i < f.size() && std::strchr("-+ #0", f[i]) != nullptr) conversion += f[i++];
    while (i < f.size() && (std::isdigit(static_cast<unsigned char>(f[i])) || f[i] == '.')) conversion += f[i++];
    while (i < f.size() && std::strchr("hlLqjzt", f[i]) != nullptr) ++i;  // the value's size decides
    const char conv = i < f.size() ? f[i] : 'u';
    char text[128];
    switch (conv) {
        case 'd':
        case 'i':
            std::snprintf(text, sizeof text, (conversion + "lld").c_str(), static_cast<long long>(SignExtend(raw, size)));
            break;
        case 'u':
        case 'x':
        case 'X':
        case 'o':
            std::snprintf(text, sizeof text, (conversion + "ll" + conv).c_str(), static_cast<unsigned long long>(raw));
            break;
        case 'c':
        case 's': {
            const char c = static_cast<char>(raw & 0xff);
            text[0] = (c >= 0x20 && c <= 0x7e) ? c : '?';
            text[1] = '\0';
            break;
        }
        default: std::snprintf(text, sizeof text, "%llu", static_cast<unsigned long long>(raw)); break;
    }
    std::string out = Literal(f.substr(0, start)) + text + Literal(i < f.size() ? f.substr(i + 1) : "");
    out.erase(out.find_last_not_of(" \t") + 1);
    return out;
}

std::vector<DecodedField> DecodeRecord(const StatsRegistry::KelTypeDef& type, const uint8_t* bytes, std::size_t size,
                                       const std::string& label) {
    Decoder decoder(bytes, size);
    decoder.Decode(type, 0, type.kind == StatsRegistry::KEL_KIND_STRUCT ? std::string() : label);
    return decoder.Take();
}

}  // namespace Tool
