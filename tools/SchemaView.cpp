#include "tools/SchemaView.h"

#include <algorithm>
#include <cctype>

#include "tarnstats/SysinfoSchema.h"
#include "tools/ToolError.h"

namespace Tool {
namespace {

const StatsRegistry::KelNode& NodeAt(unsigned node) { return kelNodesLookupTab[node]; }

std::vector<std::string> Split(const std::string& path) {
    std::vector<std::string> parts;
    std::string current;
    for (char c : path) {
        if (c == '/') {
            if (!current.empty()) parts.push_back(current);
            current.clear();
        } else {
            current += c;
        }
    }
    if (!current.empty()) parts.push_back(current);
    return parts;
}

std::string Describe(unsigned node, const std::string& name) {
    const auto& n = NodeAt(node);
    std::string line = std::to_string(node) + " " + name;
    if (!n.isLeaf && name.back() != '/') line += "/";
    if (n.isInstance) line += n.isIntegerInstance ? " [int instance]" : " [str instance]";
    if (n.outputType >= 0) line += " " + TypeName(n.outputType) + " (" + std::to_string(n.outputSize) + " bytes)";
    if (n.hasInput && n.inputType >= 0) line += " input " + TypeName(n.inputType) + " (" + std::to_string(n.inputSize) + " bytes)";
    return line;
}

void PrintBelow(std::ostream& out, unsigned node, int depth, unsigned indent) {
    if (depth == 0) return;
    for (unsigned child : Children(node)) {
        out << std::string(2 * indent, ' ') << Describe(child, NodeAt(child).name) << '\n';
        PrintBelow(out, child, depth < 0 ? depth : depth - 1, indent + 1);
    }
}

}  // namespace

unsigned ResolveNode(const std::string& text) {
    const bool number = !text.empty() && std::all_of(text.begin(), text.end(), [](unsigned char c) { return std::isdigit(c); });
    if (number) {
        if (text.size() > 9 || std::stoul(text) >= kelMaxNodes) {
            throw UsageError("unknown node " + text + ": node ids run from 0 to " + std::to_string(kelMaxNodes - 1));
        }
        return static_cast<unsigned>(std::stoul(text));
    }
    std::vector<std::string> parts = Split(text);
    if (!parts.empty() && parts.front() == NodeAt(0).name) parts.erase(parts.begin());
    if (parts.empty() && text.find('/') == std::string::npos && text != NodeAt(0).name) {
        throw UsageError("unknown node \"" + text + "\": expected a node id or a path such as statsRegistry/disk");
    }
    unsigned node = 0;
    for (const auto& part : parts) {
        bool found = false;
        for (unsigned child : Children(node)) {
            if (part == NodeAt(child).name) {
                node = child;
                found = true;
                break;
            }
        }
        if (!found) {
            throw UsageError("unknown node \"" + text + "\": " + NodePath(node) + " has no child named \"" + part + "\"");
        }
    }
    return node;
}

std::string NodePath(unsigned node) {
    std::vector<std::string> names;
    for (unsigned steps = 0; node != 0 && steps < kelMaxNodes; ++steps) {
        names.push_back(NodeAt(node).name);
        node = static_cast<unsigned>(NodeAt(node).parent);
    }
    if (names.empty()) return "/";
    std::string path;
    for (auto it = names.rbegin(); it != names.rend(); ++it) path += "/" + *it;
    return path;
}

std::vector<unsigned> Children(unsigned node) {
    std::vector<unsigned> children;
    for (int32_t c = NodeAt(node).child; c >= 0 && static_cast<uint32_t>(c) < kelMaxNodes && children.size() < kelMaxNodes;
         c = NodeAt(static_cast<unsigned>(c)).sibling) {
        children.push_back(static_cast<unsigned>(c));
    }
    std::reverse(children.begin(), children.end());
    return children;
}

std::vector<unsigned> InstanceLevels(unsigned node) {
    std::vector<unsigned> levels;
    for (unsigned at = node, steps = 0; steps < kelMaxNodes; ++steps) {
        if (NodeAt(at).isInstance) levels.push_back(at);
        if (at == 0) break;
        at = static_cast<unsigned>(NodeAt(at).parent);
    }
    std::reverse(levels.begin(), levels.end());
    return levels;
}

std::string TypeName(int32_t type) {
    if (type < 0 || static_cast<uint32_t>(type) >= kelMaxTypeDefs) return "";
    const char* name = kelTypeDefsLookupTab[type].name;
    return name ? name : "";
}

void PrintSubtree(std::ostream& out, unsigned node, int depth) {
    out << Describe(node, NodePath(node)) << '\n';
    PrintBelow(out, node, depth, 1);
}

}  // namespace Tool
