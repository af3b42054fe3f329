// The tool's commands. Each writes its result to `out`, its reasons for a missing value to `err`
// (one line each, "tarnstats: ..."), and returns an ExitStatus.
//
// Throws: UsageError for bad usage or input (main reports it and exits with kExitBadInput);
// anything else only for failures no input explains.
// REQUIRES for RunGet and RunRead: the host's tree is installed (TarnCtl::Sim::Install).
#pragma once

#include <ostream>
#include <string>
#include <vector>

#include "Plinth/Ref.h"
#include "hostsim/Host.h"
#include "tarnstats/KELStats.h"
#include "tools/Catalogue.h"

namespace Tool {

enum class Format { Table, Json, Prometheus };

// Every stat with id, name, object type, unit, value type, rollup, label and attribute names
// (Table or Json).
int RunList(const Catalogue& catalogue, Format format, std::ostream& out);

// `requests`: one STAT [INSTANCE...] word list per request. kExitNoValue when any request yields
// no value (the other requests are still printed).
int RunGet(const Catalogue& catalogue, StatsRegistry::KELStats& stats, const HostSim::Host& host,
           const std::vector<std::vector<std::string>>& requests, Format format, std::ostream& out, std::ostream& err);

// The node named by `node` (SchemaView.h) and its subtree down to `depth` levels (-1: all).
int RunSchema(const std::string& node, int depth, std::ostream& out);

// Reads the record of a leaf for `keys` (one per instance level from the top down; integer levels
// take decimal numbers) and prints it field by field. kExitNoValue when the tree holds no such
// record (the kernel access error is the reason).
int RunRead(const std::string& node, const std::vector<std::string>& keys, std::ostream& out, std::ostream& err);

}  // namespace Tool
