#include <nlohmann/json.hpp>

#include "tools/CodeTexts.h"
#include "tools/Commands.h"
#include "tools/TextTable.h"
#include "tools/ToolError.h"

namespace Tool {

int RunList(const Catalogue& catalogue, Format format, std::ostream& out) {
    if (format == Format::Json) {
        nlohmann::ordered_json stats = nlohmann::ordered_json::array();
        for (long id = 0; id < static_cast<long>(catalogue.Size()); ++id) {
            const auto& def = catalogue.Def(id);
            nlohmann::ordered_json attributes = nlohmann::ordered_json::array();
            for (const auto& a : def.attributes) {
                attributes.push_back({{"name", a.name},
                                      {"attrType", a.attrType},
                                      {"dataType", ParamTypeText(a.dataType)},
                                      {"idMapType", IdMapTypeText(a.idMapType)},
                                      {"allowWildCard", a.allowWildCard}});
            }
            stats.push_back({{"id", id},
                             {"name", def.name},
                             {"objectType", catalogue.ObjectTypeName(id)},
                             {"request", catalogue.QualifiedName(id)},
                             {"unit", UnitText(def.unit)},
                             {"valueType", ValueTypeText(def.valueType)},
                             {"rollupType", RollupText(def.rollupType)},
                             {"label", def.label},
                             {"description", def.description},
                             {"attributes", attributes}});
        }
        out << nlohmann::ordered_json{{"stats", stats}}.dump(2) << '\n';
        return kExitOk;
    }
    TextTable table({"id", "name", "object", "unit", "value type", "rollup", "label", "attributes"});
    table.AlignRight(0);
    for (long id = 0; id < static_cast<long>(catalogue.Size()); ++id) {
        const auto& def = catalogue.Def(id);
        std::string attributes;
        for (const auto& a : def.attributes) attributes += (attributes.empty() ? "" : ", ") + a.name;
        table.Add({std::to_string(id), def.name, catalogue.ObjectTypeName(id), UnitText(def.unit), ValueTypeText(def.valueType),
                   RollupText(def.rollupType), def.label, attributes.empty() ? "-" : attributes});
    }
    table.Print(out);
    return kExitOk;
}

}  // namespace Tool
