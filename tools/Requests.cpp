#include "tools/Requests.h"

#include <cctype>
#include <limits>

#include "tarnstats/KELStats.h"
#include "tools/ToolError.h"

namespace Tool {
namespace {

bool IsDecimal64(const std::string& text) {
    if (text.empty() || text.size() > 19) return false;
    for (unsigned char c : text) {
        if (!std::isdigit(c)) return false;
    }
    return std::stoull(text) <= static_cast<unsigned long long>(std::numeric_limits<long long>::max());
}

std::string JoinNames(const std::vector<std::string>& names) {
    std::string out;
    for (const auto& n : names) out += (out.empty() ? "" : ", ") + n;
    return out;
}

const HostSim::Vm* VmOwningPort(const HostSim::Host& host, const std::string& port) {
    for (const auto& vm : host.vms) {
        for (uint64_t p : vm.vnicPorts) {
            if (std::to_string(p) == port) return &vm;
        }
    }
    return nullptr;
}

}  // namespace

Request ParseRequest(const Catalogue& catalogue, const std::vector<std::string>& words) {
    Request request;
    request.statId = catalogue.Resolve(words.at(0));
    const auto& def = catalogue.Def(request.statId);
    const std::size_t levels = def.attributes.size();
    request.instances.assign(words.begin() + 1, words.end());
    if (request.instances.empty()) request.instances.assign(levels, "*");
    if (request.instances.size() != levels) {
        std::string takes = levels == 0 ? "takes no instance"
                                        : "takes " + std::to_string(levels) + (levels == 1 ? " instance (" : " instances (") +
                                              JoinNames(catalogue.AttributeNames(request.statId)) + ") or none";
        throw UsageError("stat " + std::to_string(request.statId) + " (" + catalogue.QualifiedName(request.statId) + ") " +
                         takes + ", got " + std::to_string(request.instances.size()));
    }
    for (std::size_t i = 0; i < levels; ++i) {
        const auto& attr = def.attributes[i];
        const std::string& text = request.instances[i];
        const std::string where = "instance \"" + text + "\" of attribute \"" + attr.name + "\" of " +
                                  catalogue.QualifiedName(request.statId);
        if (text.empty()) {
            throw UsageError("empty instance for attribute \"" + attr.name + "\" of " +
                             catalogue.QualifiedName(request.statId) + ": expected a text or \"*\"");
        }
        const bool numbered = attr.dataType == StatsRegistry::SR_PARAMTYPE_INT &&
                              attr.idMapType != StatsRegistry::SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE;
        if (numbered && text != "*" && !IsDecimal64(text)) {
            throw UsageError(where + ": expected a decimal number up to " +
                             std::to_string(std::numeric_limits<long long>::max()) + " or \"*\"");
        }
    }
    return request;
}

std::string RequestText(const Catalogue& catalogue, const Request& request) {
    std::string out = catalogue.QualifiedName(request.statId);
    for (const auto& i : request.instances) out += " " + i;
    return out;
}

std::vector<Request> LibraryRequests(const Catalogue& catalogue, const HostSim::Host& host, const Request& request) {
    std::vector<Request> out{request};
    const auto& attrs = catalogue.Def(request.statId).attributes;
    for (std::size_t i = 0; i + 1 < attrs.size(); ++i) {
        if (!StatsRegistry::KELStats::IsVmMoid(static_cast<unsigned>(attrs[i].idMapType)) ||
            !StatsRegistry::KELStats::IsVnicToPort(static_cast<unsigned>(attrs[i + 1].idMapType))) {
            continue;
        }
        std::vector<Request> expanded;
        for (const auto& r : out) {
            const std::string& moid = r.instances[i];
            const std::string& port = r.instances[i + 1];
            if (moid != "*" && port != "*") {
                expanded.push_back(r);
                continue;
            }
            bool matched = false;  // a VM of the host answers for this moid and port
            for (const auto& vm : host.vms) {
                if (moid != "*" && moid != vm.moid) continue;
                if (port != "*") {
                    if (VmOwningPort(host, port) != &vm) continue;
                    matched = true;
                    expanded.push_back(r);
                    expanded.back().instances[i] = vm.moid;
                    continue;
                }
                matched = true;
                for (uint64_t p : vm.vnicPorts) {
                    expanded.push_back(r);
                    expanded.back().instances[i] = vm.moid;
                    expanded.back().instances[i + 1] = std::to_string(p);
                }
            }
            if (!matched) expanded.push_back(r);  // nothing the host knows: the library decides
        }
        out = std::move(expanded);
    }
    return out;
}

}  // namespace Tool
