#include <nlohmann/json.hpp>

#include "tools/CodeTexts.h"
#include "tools/Commands.h"
#include "tools/Prometheus.h"
#include "tools/Requests.h"
#include "tools/TextTable.h"
#include "tools/ToolError.h"

namespace Tool {
namespace {

struct Value {
    std::vector<std::string> instances;
    int64_t value = 0;
};

struct Answer {
    Request request;
    std::vector<Value> values;
};

std::vector<Value> Ask(StatsRegistry::KELStats& stats, const std::vector<Request>& requests) {
    Plinth::RefVector<StatsRegistry::StatInstance> asked;
    for (const auto& r : requests) asked.Append(new StatsRegistry::StatInstance(r.statId, r.instances));
    Plinth::RefVector<StatsRegistry::StatInstanceValue> results;
    if (!asked.empty()) stats.GetStatValues(asked, results);
    std::vector<Value> values;
    for (const auto& v : results) {
        if (v && v->statInstance) values.push_back(Value{v->statInstance->attrInstances, v->value});
    }
    return values;
}

void PrintTables(const Catalogue& catalogue, const std::vector<Answer>& answers, std::ostream& out) {
    bool first = true;
    for (const auto& a : answers) {
        if (a.values.empty()) continue;
        const long id = a.request.statId;
        const auto& def = catalogue.Def(id);
        std::vector<std::string> header{"id", "stat", "object"};
        for (const auto& name : catalogue.AttributeNames(id)) header.push_back(name);
        header.push_back("value");
        header.push_back("unit");
        TextTable table(header);
        table.AlignRight(0);
        table.AlignRight(header.size() - 2);
        for (const auto& v : a.values) {
            std::vector<std::string> row{std::to_string(id), def.name, catalogue.ObjectTypeName(id)};
            for (std::size_t i = 0; i < def.attributes.size(); ++i) row.push_back(i < v.instances.size() ? v.instances[i] : "");
            row.push_back(std::to_string(v.value));
            row.push_back(UnitText(def.unit));
            table.Add(row);
        }
        if (!first) out << '\n';
        first = false;
        table.Print(out);
    }
}

void PrintJson(const Catalogue& catalogue, const std::vector<Answer>& answers, std::ostream& out) {
    nlohmann::ordered_json list = nlohmann::ordered_json::array();
    for (const auto& a : answers) {
        const long id = a.request.statId;
        const auto& def = catalogue.Def(id);
        const auto names = catalogue.AttributeNames(id);
        nlohmann::ordered_json values = nlohmann::ordered_json::array();
        for (const auto& v : a.values) {
            nlohmann::ordered_json instances = nlohmann::ordered_json::object();
            for (std::size_t i = 0; i < names.size() && i < v.instances.size(); ++i) instances[names[i]] = v.instances[i];
            values.push_back({{"instances", instances}, {"value", v.value}});
        }
        list.push_back({{"stat", id},
                        {"name", def.name},
                        {"objectType", catalogue.ObjectTypeName(id)},
                        {"unit", UnitText(def.unit)},
                        {"attributes", names},
                        {"instances", a.request.instances},
                        {"values", values}});
    }
    // Instance texts come from the command line too: bytes that are no UTF-8 are replaced.
    out << nlohmann::ordered_json{{"requests", list}}.dump(2, ' ', false, nlohmann::ordered_json::error_handler_t::replace)
        << '\n';
}

}  // namespace

int RunGet(const Catalogue& catalogue, StatsRegistry::KELStats& stats, const HostSim::Host& host,
           const std::vector<std::vector<std::string>>& requests, Format format, std::ostream& out, std::ostream& err) {
    if (requests.empty()) throw UsageError("get needs at least one request: STAT [INSTANCE...]");
    std::vector<Answer> answers;
    for (const auto& words : requests) answers.push_back(Answer{ParseRequest(catalogue, words), {}});
    for (auto& a : answers) a.values = Ask(stats, LibraryRequests(catalogue, host, a.request));

    if (format == Format::Json) {
        PrintJson(catalogue, answers, out);
    } else if (format == Format::Prometheus) {
        PrometheusWriter writer(catalogue);
        for (const auto& a : answers) {
            for (const auto& v : a.values) writer.Add(a.request.statId, v.instances, v.value);
        }
        writer.Print(out);
    } else {
        PrintTables(catalogue, answers, out);
    }
    int status = kExitOk;
    for (const auto& a : answers) {
        if (!a.values.empty()) continue;
        err << "tarnstats: no value for " << RequestText(catalogue, a.request) << '\n';
        status = kExitNoValue;
    }
    return status;
}

}  // namespace Tool
