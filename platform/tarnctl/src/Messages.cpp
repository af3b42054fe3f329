#include "Messages.h"

#include <cstdio>
#include <stdexcept>

#include "Keel/KeelException.h"

namespace TarnCtl {
namespace Sim {

namespace detail {

std::string KeyText(const Key& key) {
    if (key.isInteger) {
        return std::to_string(key.number);
    }
    std::string out = "\"";
    for (char c : key.text) {
        const unsigned char u = static_cast<unsigned char>(c);
        if (c == '"' || c == '\\') {
            out += '\\';
            out += c;
        } else if (u < 0x20 || u > 0x7e) {
            char hex[8];
            std::snprintf(hex, sizeof hex, "\\x%02x", u);
            out += hex;
        } else {
            out += c;
        }
    }
    out += '"';
    return out;
}

const char* KindText(bool isInteger) noexcept { return isInteger ? "integer" : "string"; }

std::string NodeText(unsigned node, const NodeInfo* info) {
    std::string out = "node " + std::to_string(node);
    if (info != nullptr) {
        out += " \"" + info->name + "\"";
    }
    return out;
}

std::string FailureText(const char* op, unsigned node, const NodeInfo* info, const Key* path, unsigned count,
                        const std::string& reason) {
    std::string pathText;
    if (count > Util::Sysinfo::kMaxPathKeys) {
        pathText = PathText(path, Util::Sysinfo::kMaxPathKeys);
        pathText.insert(pathText.size() - 1, ", ...");
    } else {
        pathText = PathText(path, count);
    }
    return std::string(op) + " of sysinfo " + NodeText(node, info) + " with path " + pathText + ": " + reason;
}

void ThrowKeel(const char* op, unsigned node, const NodeInfo* info, const Key* path, unsigned count,
               const std::string& reason) {
    throw Keel::Lib::KeelException(FailureText(op, node, info, path, count, reason));
}

void ThrowInvalid(const char* op, unsigned node, const NodeInfo* info, const Key* path, unsigned count,
                  const std::string& reason) {
    throw std::invalid_argument(FailureText(op, node, info, path, count, reason));
}

}  // namespace detail

std::string PathText(const Key* path, unsigned count) {
    std::string out = "[";
    for (unsigned i = 0; i < count; ++i) {
        if (i > 0) {
            out += ", ";
        }
        out += detail::KeyText(path[i]);
    }
    out += "]";
    return out;
}

}  // namespace Sim
}  // namespace TarnCtl
