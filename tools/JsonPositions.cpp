#include "tools/JsonPositions.h"

#include <cstdint>
#include <set>

namespace HostSim {
namespace {

void AppendUtf8(std::string& out, uint32_t cp) {
    if (cp < 0x80) {
        out += static_cast<char>(cp);
    } else if (cp < 0x800) {
        out += static_cast<char>(0xc0 | (cp >> 6));
        out += static_cast<char>(0x80 | (cp & 0x3f));
    } else if (cp < 0x10000) {
        out += static_cast<char>(0xe0 | (cp >> 12));
        out += static_cast<char>(0x80 | ((cp >> 6) & 0x3f));
        out += static_cast<char>(0x80 | (cp & 0x3f));
    } else {
        out += static_cast<char>(0xf0 | (cp >> 18));
        out += static_cast<char>(0x80 | ((cp >> 12) & 0x3f));
        out += static_cast<char>(0x80 | ((cp >> 6) & 0x3f));
        out += static_cast<char>(0x80 | (cp & 0x3f));
    }
}

// A single pass over valid JSON. Strings hold no raw line breaks in valid JSON, so lines are
// counted in the whitespace between tokens only.
class Scanner {
public:
    Scanner(const std::string& text, JsonPositions& out) : text_(text), out_(out) {}

    void Document() {
        SkipSpace();
        const TextPosition start = Here();
        Value("", start, 0);
    }

private:
    bool AtEnd() const { return pos_ >= text_.size(); }
    char Peek() const { return AtEnd() ? '\0' : text_[pos_]; }
    TextPosition Here() const { return TextPosition{line_, pos_ - lineStart_ + 1}; }

    void SkipSpace() {
        while (!AtEnd()) {
            const char c = text_[pos_];
            if (c == '\n') {
                ++line_;
                lineStart_ = pos_ + 1;
            } else if (c != ' ' && c != '\t' && c != '\r') {
                return;
            }
            ++pos_;
        }
    }

    unsigned Hex4() {
        unsigned v = 0;
        for (int i = 0; i < 4 && !AtEnd(); ++i, ++pos_) {
            const char c = text_[pos_];
            v <<= 4;
            if (c >= '0' && c <= '9') v |= static_cast<unsigned>(c - '0');
            else if (c >= 'a' && c <= 'f') v |= static_cast<unsigned>(c - 'a' + 10);
            else if (c >= 'A' && c <= 'F') v |= static_cast<unsigned>(c - 'A' + 10);
        }
        return v;
    }

    // Reads a string token and returns its decoded text (UTF-8), as a parser would hold it.
    std::string String() {
        std::string out;
        ++pos_;  // opening quote
        while (!AtEnd() && text_[pos_] != '"') {
            const char c = text_[pos_++];
            if (c != '\\') {
                out += c;
                continue;
            }
            const char e = Peek();
            ++pos_;
            switch (e) {
                case 'b': out += '\b'; break;
                case 'f': out += '\f'; break;
                case 'n': out += '\n'; break;
                case 'r': out += '\r'; break;
                case 't': out += '\t'; break;
                case 'u': {
                    uint32_t cp = Hex4();
                    if (cp >= 0xd800 && cp < 0xdc00 && Peek() == '\\' && pos_ + 1 < text_.size() &&
                        text_[pos_ + 1] == 'u') {
                        pos_ += 2;
                        const uint32_t low = Hex4();
                        cp = 0x10000 + ((cp - 0xd800) << 10) + (low - 0xdc00);
                    }
                    AppendUtf8(out, cp);
                    break;
                }
                default: out += e; break;  // '"', '\\', '/'
            }
        }
        ++pos_;  // closing quote
        return out;
    }

    void Value(const std::string& pointer, TextPosition keyPos, unsigned depth) {
        const TextPosition at = Here();
        if (depth > JsonPositions::kMaxDepth) {
            throw JsonPositionError(at, pointer,
                                    "nesting deeper than " + std::to_string(JsonPositions::kMaxDepth) + " levels");
        }
        out_.Add(pointer, JsonPlace{at, keyPos});
        const char c = Peek();
        if (c == '{') {
            Object(pointer, depth);
        } else if (c == '[') {
            Array(pointer, depth);
        } else if (c == '"') {
            String();
        } else {
            while (!AtEnd()) {
                const char d = text_[pos_];
                if (d == ',' || d == ']' || d == '}' || d == ' ' || d == '\t' || d == '\r' || d == '\n') break;
                ++pos_;
            }
        }
    }

    void Object(const std::string& pointer, unsigned depth) {
        ++pos_;
        SkipSpace();
        std::set<std::string> names;
        while (!AtEnd() && Peek() != '}') {
            const TextPosition keyPos = Here();
            const std::string name = String();
            const std::string child = PointerChild(pointer, name);
            if (!names.insert(name).second) {
                throw JsonPositionError(keyPos, child, "duplicate member \"" + name + "\"");
            }
            SkipSpace();
            ++pos_;  // ':'
            SkipSpace();
            Value(child, keyPos, depth + 1);
            SkipSpace();
            if (Peek() == ',') {
                ++pos_;
                SkipSpace();
            }
        }
        ++pos_;
    }

    void Array(const std::string& pointer, unsigned depth) {
        ++pos_;
        SkipSpace();
        for (std::size_t i = 0; !AtEnd() && Peek() != ']'; ++i) {
            const TextPosition at = Here();
            Value(PointerChild(pointer, i), at, depth + 1);
            SkipSpace();
            if (Peek() == ',') {
                ++pos_;
                SkipSpace();
            }
        }
        ++pos_;
    }

    const std::string& text_;
    JsonPositions& out_;
    std::size_t pos_ = 0;
    std::size_t line_ = 1;
    std::size_t lineStart_ = 0;
};

}  // namespace

TextPosition PositionOf(const std::string& text, std::size_t offset) {
    TextPosition p;
    std::size_t lineStart = 0;
    const std::size_t end = offset < text.size() ? offset : text.size();
    for (std::size_t i = 0; i < end; ++i) {
        if (text[i] == '\n') {
            ++p.line;
            lineStart = i + 1;
        }
    }
    p.column = end - lineStart + 1;
    return p;
}

JsonPlace JsonPositions::At(const std::string& pointer) const {
    auto it = places_.find(pointer);
    if (it != places_.end()) return it->second;
    it = places_.find("");
    return it != places_.end() ? it->second : JsonPlace{};
}

std::string PointerChild(const std::string& parent, const std::string& member) {
    std::string out = parent + "/";
    for (char c : member) {
        if (c == '~') out += "~0";
        else if (c == '/') out += "~1";
        else out += c;
    }
    return out;
}

std::string PointerChild(const std::string& parent, std::size_t index) {
    return parent + "/" + std::to_string(index);
}

JsonPositions IndexJsonPositions(const std::string& text) {
    JsonPositions out;
    Scanner(text, out).Document();
    return out;
}

}  // namespace HostSim
