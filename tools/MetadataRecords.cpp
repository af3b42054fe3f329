#include "tools/MetadataRecords.h"

#include <algorithm>
#include <cstring>
#include <string>

#include "tarnstats/StatCatalogue.h"
#include "tarnstats/SysinfoSchema.h"
#include "tools/CodeTexts.h"
#include "tools/SchemaView.h"

namespace Tool {
namespace {

using StatsRegistry::KelField;
using StatsRegistry::KelTypeDef;

// Writes the members of one structure value at `base` of a record.
class StructWriter {
public:
    StructWriter(const KelTypeDef& type, std::vector<uint8_t>& record, std::size_t base)
        : type_(type), record_(record), base_(base) {}

    void Int(const char* member, uint64_t value) {
        const KelField* f = Find(member);
        if (f == nullptr) return;
        const std::size_t size = f->typeDef->size < 8 ? f->typeDef->size : 8;
        for (std::size_t i = 0; i < size; ++i) record_[base_ + f->offset + i] = static_cast<uint8_t>(value >> (8 * i));
    }
    void Text(const char* member, const char* text) {
        const KelField* f = Find(member);
        if (f == nullptr || f->typeDef->size == 0 || text == nullptr) return;
        const std::size_t n = std::min<std::size_t>(std::strlen(text), f->typeDef->size - 1);
        std::memcpy(record_.data() + base_ + f->offset, text, n);
    }
    // The member named `member` when it lies within the record; null otherwise.
    const KelField* Find(const char* member) const {
        const KelField* fields = type_.elemIndexOrTable.fields;
        for (uintptr_t i = 0; fields != nullptr && i < type_.elemTypeOrCount.count; ++i) {
            if (std::strcmp(fields[i].name, member) == 0 && base_ + fields[i].offset + fields[i].typeDef->size <= record_.size()) {
                return &fields[i];
            }
        }
        return nullptr;
    }
    std::size_t Base() const noexcept { return base_; }

private:
    const KelTypeDef& type_;
    std::vector<uint8_t>& record_;
    std::size_t base_;
};

}  // namespace

std::vector<uint8_t> MetadataRecord(long statId) {
    const KelTypeDef* type = FindType("StatsRegistry_Metadata");
    if (type == nullptr || type->kind != StatsRegistry::KEL_KIND_STRUCT) return {};
    std::vector<uint8_t> record(type->size, 0);
    const auto& m = statMetadataTab[statId];
    StructWriter w(*type, record, 0);
    w.Text("name", m.name);
    w.Int("objectType", static_cast<uint32_t>(m.objectType));
    w.Int("transformType", static_cast<uint32_t>(m.transformType));
    w.Int("valueType", static_cast<uint32_t>(m.valueType));
    w.Int("unit", static_cast<uint32_t>(m.unit));
    w.Int("rollupType", static_cast<uint32_t>(m.rollupType));
    w.Int("statOptions", static_cast<uint32_t>(m.statOptions));
    w.Text("label", m.label);
    w.Text("description", m.description);
    w.Text("localization", m.localization);
    const KelField* attributes = w.Find("attributes");
    if (attributes == nullptr || attributes->typeDef->kind != StatsRegistry::KEL_KIND_ARRAY) return record;
    const KelTypeDef* elem = attributes->typeDef->elemTypeOrCount.elemType;
    if (elem == nullptr || elem->size == 0) return record;
    const std::size_t slots = attributes->typeDef->size / elem->size;
    for (uint32_t j = 0; j < m.numAttributes && j < slots; ++j) {
        const auto& a = statAttributesTab[m.attributeIds[j]];
        StructWriter aw(*elem, record, attributes->offset + j * elem->size);
        aw.Int("idMapType", static_cast<uint32_t>(a.idMapType));
        aw.Int("type", static_cast<uint32_t>(a.type));
        aw.Text("name", a.name);
        aw.Int("allowWildCard", static_cast<uint32_t>(a.allowWildCard));
    }
    return record;
}

void AddMetadataRecords(TarnCtl::Sim::Tree& tree) {
    const KelTypeDef* type = FindType("StatsRegistry_Metadata");
    if (type == nullptr) return;
    for (uint32_t node = 0; node < kelMaxNodes; ++node) {
        const auto& n = kelNodesLookupTab[node];
        if (!n.isLeaf || n.outputTypeDef != type || n.statLink < 0 || static_cast<uint32_t>(n.statLink) >= statIdMax) continue;
        if (!InstanceLevels(node).empty()) continue;
        tree.SetRecord(node, {}, MetadataRecord(n.statLink));
    }
}

}  // namespace Tool
