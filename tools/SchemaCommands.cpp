#include <cctype>
#include <cstdint>

#include "Keel/KeelException.h"
#include "TarnCtl/SimTree.h"
#include "TarnCtl/Sysinfo.h"
#include "tarnstats/SysinfoSchema.h"
#include "tools/Commands.h"
#include "tools/RecordDecoder.h"
#include "tools/SchemaView.h"
#include "tools/ToolError.h"

namespace Tool {
namespace {

bool ParseKeyNumber(const std::string& text, uint64_t& value) {
    if (text.empty() || text.size() > 20) return false;
    value = 0;
    for (unsigned char c : text) {
        if (!std::isdigit(c)) return false;
        const uint64_t digit = c - '0';
        if (value > (UINT64_MAX - digit) / 10) return false;
        value = value * 10 + digit;
    }
    return true;
}

std::string LevelList(const std::vector<unsigned>& levels) {
    std::string out;
    for (unsigned l : levels) {
        out += (out.empty() ? "" : ", ") + std::string(kelNodesLookupTab[l].name) +
               (kelNodesLookupTab[l].isIntegerInstance ? ": number" : ": name");
    }
    return out;
}

}  // namespace

int RunSchema(const std::string& node, int depth, std::ostream& out) {
    PrintSubtree(out, ResolveNode(node), depth);
    return kExitOk;
}

int RunRead(const std::string& nodeText, const std::vector<std::string>& keys, std::ostream& out, std::ostream& err) {
    const unsigned node = ResolveNode(nodeText);
    const auto& n = kelNodesLookupTab[node];
    const std::string where = "node " + std::to_string(node) + " (" + NodePath(node) + ")";
    if (!n.isLeaf) throw UsageError(where + " is a branch: only leaves hold records");
    if (n.outputType < 0 || n.outputTypeDef == nullptr) throw UsageError(where + " declares no record type");
    const std::vector<unsigned> levels = InstanceLevels(node);
    if (keys.size() != levels.size()) {
        throw UsageError(where + " takes " + std::to_string(levels.size()) + (levels.size() == 1 ? " key" : " keys") +
                         (levels.empty() ? "" : " (" + LevelList(levels) + ")") + ", got " + std::to_string(keys.size()));
    }
    std::vector<TarnCtl::Util::Sysinfo::Key> path;
    for (std::size_t i = 0; i < keys.size(); ++i) {
        TarnCtl::Util::Sysinfo::Key key;
        key.isInteger = kelNodesLookupTab[levels[i]].isIntegerInstance != 0;
        if (key.isInteger && !ParseKeyNumber(keys[i], key.number)) {
            throw UsageError("key \"" + keys[i] + "\" of level " + kelNodesLookupTab[levels[i]].name + " of " + where +
                             ": expected a decimal number from 0 to 18446744073709551615");
        }
        if (!key.isInteger) key.text = keys[i];
        path.push_back(key);
    }
    std::vector<uint8_t> record(n.outputSize, 0);
    try {
        TarnCtl::Util::Sysinfo accessor(node);
        for (const auto& key : path) {
            if (key.isInteger) accessor.AddInstancePath(static_cast<unsigned long long>(key.number));
            else accessor.AddInstancePath(key.text);
        }
        accessor.Get(record.data(), static_cast<unsigned>(record.size()));
    } catch (const Keel::Lib::KeelException& e) {
        err << "tarnstats: no record: " << e.what() << '\n';
        return kExitNoValue;
    }
    out << NodePath(node) << ' ' << TarnCtl::Sim::PathText(path.data(), static_cast<unsigned>(path.size())) << ": "
        << TypeName(n.outputType) << " (" << n.outputSize << " bytes)\n";
    for (const auto& [label, text] : DecodeRecord(*n.outputTypeDef, record.data(), record.size(), n.name)) {
        out << label << ": " << text << '\n';
    }
    return kExitOk;
}

}  // namespace Tool
