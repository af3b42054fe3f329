#include "tools/Catalogue.h"

#include <cctype>
#include <stdexcept>

#include "tarnstats/StatCatalogue.h"
#include "tools/CodeTexts.h"
#include "tools/ToolError.h"

namespace Tool {
namespace {

bool SameIgnoringCase(const std::string& a, const std::string& b) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (std::tolower(static_cast<unsigned char>(a[i])) != std::tolower(static_cast<unsigned char>(b[i]))) {
            return false;
        }
    }
    return true;
}

bool AllDigits(const std::string& text) {
    if (text.empty()) return false;
    for (unsigned char c : text) {
        if (!std::isdigit(c)) return false;
    }
    return true;
}

}  // namespace

Catalogue::Catalogue(Plinth::RefVector<StatsRegistry::StatDef> defs) : defs_(std::move(defs)) {
    if (defs_.size() != statIdMax) throw std::logic_error("the library lists " + std::to_string(defs_.size()) + " stats, not " + std::to_string(statIdMax));
    for (std::size_t i = 0; i < defs_.size(); ++i) {
        if (!defs_[i] || defs_[i]->id != static_cast<long>(i)) {
            throw std::logic_error("the library's stat list is out of order at entry " + std::to_string(i));
        }
    }
}

int32_t Catalogue::ObjectType(long id) const { return statMetadataTab[id].objectType; }

std::string Catalogue::ObjectTypeName(long id) const { return ObjectTypeText(ObjectType(id)); }

std::string Catalogue::QualifiedName(long id) const { return Def(id).name + "@" + ObjectTypeName(id); }

std::vector<std::string> Catalogue::AttributeNames(long id) const {
    std::vector<std::string> names;
    for (const auto& a : Def(id).attributes) names.push_back(a.name);
    return names;
}

long Catalogue::Resolve(const std::string& text) const {
    const long count = static_cast<long>(defs_.size());
    if (AllDigits(text)) {
        if (text.size() > 9 || std::stol(text) >= count) {
            throw UsageError("unknown stat id " + text + ": stat ids run from 0 to " + std::to_string(count - 1));
        }
        return std::stol(text);
    }
    const auto at = text.rfind('@');
    const std::string name = at == std::string::npos ? text : text.substr(0, at);
    std::vector<long> named;
    for (long id = 0; id < count; ++id) {
        if (Def(id).name == name) named.push_back(id);
    }
    auto candidates = [&] {
        std::string list;
        for (long id : named) list += (list.empty() ? "" : ", ") + QualifiedName(id) + " (" + std::to_string(id) + ")";
        return list;
    };
    if (at != std::string::npos) {
        const std::string type = text.substr(at + 1);
        bool knownType = false;
        std::string types;
        for (const auto& e : EnumEntries("SRStatObjectType")) {
            knownType = knownType || SameIgnoringCase(e.text, type);
            types += (types.empty() ? "" : ", ") + e.text;
        }
        if (!knownType) {
            throw UsageError("unknown object type \"" + type + "\" in \"" + text + "\": expected one of " + types);
        }
        for (long id : named) {
            if (SameIgnoringCase(ObjectTypeName(id), type)) return id;
        }
        if (named.empty()) throw UsageError("unknown stat \"" + name + "\" (tarnstats list shows every stat)");
        throw UsageError("no stat \"" + text + "\": the name \"" + name + "\" belongs to " + candidates());
    }
    if (named.empty()) throw UsageError("unknown stat \"" + name + "\" (tarnstats list shows every stat)");
    if (named.size() > 1) throw UsageError("ambiguous stat name \"" + name + "\": use one of " + candidates());
    return named.front();
}

}  // namespace Tool
