// tarnstats: the stats of a simulated host, read through the library, and the sysinfo schema.
//
//   tarnstats [--host FILE] [-v] list [--json]
//   tarnstats [--host FILE] [-v] get [--json | --prometheus] STAT [INSTANCE...] [-r STAT [INSTANCE...]]...
//   tarnstats schema [--depth N] [NODE | PATH]
//   tarnstats [--host FILE] read NODE [KEY...]
//
// Exit status: 0 success, 1 a request or read yields no value, 2 bad usage or input, 3 an
// internal failure. docs/tool.md describes the commands.
#include <CLI/CLI.hpp>
#include <cstdint>
#include <iostream>
#include <memory>
#include <string>
#include <vector>

#include "Plinth/Service.h"
#include "TarnCtl/SimTree.h"
#include "hostsim/Host.h"
#include "hostsim/HostFile.h"
#include "tarnstats/KELStats.h"
#include "tools/Catalogue.h"
#include "tools/Commands.h"
#include "tools/MetadataRecords.h"
#include "tools/ToolError.h"

namespace {

constexpr uint32_t kDefaultLogLevels = Plinth::Service::Logger::LOG_ERROR | Plinth::Service::Logger::LOG_WARNING;

struct Options {
    std::string hostFile;
    bool verbose = false;
    bool json = false;
    bool prometheus = false;
    std::vector<std::string> request;
    std::vector<std::vector<std::string>> moreRequests;
    std::string node = "/";
    int depth = -1;
    std::vector<std::string> keys;
};

Tool::Format FormatOf(const Options& o) {
    if (o.json) return Tool::Format::Json;
    if (o.prometheus) return Tool::Format::Prometheus;
    return Tool::Format::Table;
}

// The host's tree with the stats' metadata records, installed for the library's accessors for as
// long as the object lives.
class InstalledHost {
public:
    explicit InstalledHost(const HostSim::Host& host) : tree_(HostSim::BuildTree(host)) {
        Tool::AddMetadataRecords(*tree_);
        TarnCtl::Sim::Install(tree_);
    }
    ~InstalledHost() { TarnCtl::Sim::Install(nullptr); }
    InstalledHost(const InstalledHost&) = delete;
    InstalledHost& operator=(const InstalledHost&) = delete;

private:
    std::shared_ptr<TarnCtl::Sim::Tree> tree_;
};

HostSim::Host LoadHost(const Options& o) {
    if (o.hostFile.empty()) return HostSim::SampleHost();
    try {
        return HostSim::LoadHostFile(o.hostFile);
    } catch (const HostSim::HostFileError& e) {
        throw Tool::UsageError(e.what());
    }
}

// THROWS UsageError when the host model refuses the host.
std::unique_ptr<InstalledHost> Install(const HostSim::Host& host, const Options& o) {
    try {
        return std::make_unique<InstalledHost>(host);
    } catch (const std::invalid_argument& e) {
        throw Tool::UsageError((o.hostFile.empty() ? std::string("the sample host") : o.hostFile) + ": " + e.what());
    }
}

int Run(const Options& o, const CLI::App& app) {
    Plinth::Service::GetApp()->GetLogService()->SetAllLevels(
        kDefaultLogLevels | (o.verbose ? static_cast<uint32_t>(Plinth::Service::Logger::LOG_TRACE) : 0u));
    if (app.got_subcommand("schema")) return Tool::RunSchema(o.node, o.depth, std::cout);

    const HostSim::Host host = LoadHost(o);
    const auto installed = Install(host, o);
    if (app.got_subcommand("read")) return Tool::RunRead(o.node, o.keys, std::cout, std::cerr);

    Plinth::Ref<StatsRegistry::KELStats> stats;
    StatsRegistry::KELStatsFactory::GetKELStats(stats);
    Plinth::RefVector<StatsRegistry::StatDef> defs;
    stats->GetStatsList(defs);
    const Tool::Catalogue catalogue(std::move(defs));
    if (app.got_subcommand("list")) return Tool::RunList(catalogue, FormatOf(o), std::cout);

    std::vector<std::vector<std::string>> requests;
    if (!o.request.empty()) requests.push_back(o.request);
    requests.insert(requests.end(), o.moreRequests.begin(), o.moreRequests.end());
    return Tool::RunGet(catalogue, *stats, host, requests, FormatOf(o), std::cout, std::cerr);
}

}  // namespace

int main(int argc, char** argv) {
    Options o;
    CLI::App app{"The capacity and contention stats of a simulated host, read through libtarnstats.", "tarnstats"};
    app.require_subcommand(1);
    app.fallthrough();
    app.add_option("--host", o.hostFile, "Read the host from a host description file instead of the built-in sample host")
        ->type_name("FILE");
    app.add_flag("-v,--verbose", o.verbose, "Also write the library's trace messages (log level 64) to stderr");

    auto* list = app.add_subcommand("list", "List every stat of the catalogue");
    list->add_flag("--json", o.json, "Write JSON");

    auto* get = app.add_subcommand("get", "Read stat values: STAT [INSTANCE...], more requests after -r");
    get->add_option("request", o.request, "STAT (id, name@objectType or unique name), then one INSTANCE per attribute or \"*\"")
        ->type_name("STAT [INSTANCE...]");
    get->add_option("-r,--request", o.moreRequests, "Another request")
        ->type_name("STAT [INSTANCE...]")
        ->expected(1, CLI::detail::expected_max_vector_size)
        ->allow_extra_args();
    auto* json = get->add_flag("--json", o.json, "Write JSON");
    auto* prometheus = get->add_flag("--prometheus", o.prometheus, "Write the Prometheus text exposition format");
    json->excludes(prometheus);

    auto* schema = app.add_subcommand("schema", "Show a node of the sysinfo schema and its subtree");
    schema->add_option("node", o.node, "Node id or path (default: the whole tree)")->type_name("NODE|PATH");
    schema->add_option("--depth", o.depth, "Levels to show below the node (default: all)")->check(CLI::NonNegativeNumber);

    auto* read = app.add_subcommand("read", "Read one record of the host's sysinfo tree and decode it");
    read->add_option("node", o.node, "Leaf node id or path")->required()->type_name("NODE|PATH");
    read->add_option("keys", o.keys, "One key per instance level, from the top down")->type_name("KEY...");

    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        if (e.get_exit_code() == static_cast<int>(CLI::ExitCodes::Success)) return app.exit(e);
        std::cerr << "tarnstats: " << e.what() << " (tarnstats --help shows the usage)\n";
        return Tool::kExitBadInput;
    }
    try {
        return Run(o, app);
    } catch (const Tool::UsageError& e) {
        std::cerr << "tarnstats: " << e.what() << '\n';
        return Tool::kExitBadInput;
    } catch (const std::exception& e) {
        std::cerr << "tarnstats: internal error: " << e.what() << '\n';
        return Tool::kExitInternal;
    }
}
