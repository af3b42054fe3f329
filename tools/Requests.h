// Requests of `tarnstats get`: what the user typed, checked against the catalogue, and what the
// library is asked for it.
//
// A request is a stat (as Catalogue::Resolve reads it) followed by one instance per attribute
// level of the stat, synthetic levels included, or by no instance at all, which means "*" on every
// level. An integer level (data type "int", except a virtual disk level, which takes the disk's
// device name) takes a decimal number or "*"; any level rejects an empty text.
//
// A VM moid level names a VM by its managed object id and is no level of the sysinfo tree, so
// the library cannot list it. The tool, which knows the host, asks the library per VM instead:
// LibraryRequests turns "*" at a VM moid level into one request per VM of the host (or the VM
// named), and "*" at the vNIC port level after it into that VM's ports; with "*" for the VM and a
// port, the VM that owns the port. A request naming both, or naming a VM or port that the host
// does not know, is passed on unchanged and the library answers it as it stands. A VM known to
// the host with no vNIC gives no request at all.
//
// Throws: ParseRequest throws UsageError with the reason (unknown or ambiguous stat, wrong
// instance count with the attribute names, bad instance text).
#pragma once

#include <string>
#include <vector>

#include "hostsim/Host.h"
#include "tools/Catalogue.h"

namespace Tool {

struct Request {
    long statId = 0;
    std::vector<std::string> instances;  // one per attribute level
};

// `words` is STAT [INSTANCE...]; REQUIRES: it is not empty. THROWS UsageError.
Request ParseRequest(const Catalogue& catalogue, const std::vector<std::string>& words);

// The request's text for messages: "virtualDisk.throughput.usage@vDisk 2001 *".
std::string RequestText(const Catalogue& catalogue, const Request& request);

// The requests that the library answers for `request` on `host` (see above), in host order.
std::vector<Request> LibraryRequests(const Catalogue& catalogue, const HostSim::Host& host, const Request& request);

}  // namespace Tool
