#include <string>
#include <vector>

#include "idmap/KELIdMapper.h"
#include "platform/LogGate.h"
#include "retrieval/NumberText.h"
#include "tarnstats/KELStatsImpl.h"

namespace StatsRegistry {

void KELStatsImpl::GetStatValue(std::set<long> const& statIds, long statId, unsigned int node,
                                std::vector<std::string> const& requested, std::vector<std::string>& working,
                                unsigned int level, Plinth::RefVector<StatInstanceValue>& values) {
    if (level >= requested.size()) {
        RetrieveStatValues(statIds, statId, node, working, values);
        return;
    }

    if (requested[level] == "*") {
        std::vector<std::string> instances;
        if (!RetrieveKelStatAttrInstance(node, statId, working, level, instances)) return;
        Log::Write(logger.Get(), Log::kTrace, "attr list count %1", Log::UInt{static_cast<uint32_t>(instances.size())});
        for (std::string& instance : instances) {
            working[level] = std::move(instance);
            GetStatValue(statIds, statId, node, requested, working, level + 1, values);
        }
        return;
    }

    if (GetIdMapType(statId, level) != SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE) {
        GetStatValue(statIds, statId, node, requested, working, level + 1, values);
        return;
    }

    // A virtual disk named by its device name: the kernel keys it by the handle within the VM's
    // world group, taken from the concrete instance of the level before.
    if (level == 0 || !IsPrevAttrVm(statId, level)) {
        Log::Write(logger.Get(), Log::kWarning, "no VM attr before vSCSI(%1:%2)", Log::Int{static_cast<int32_t>(statId)},
                   Log::UInt{level});
        return;
    }
    unsigned long long worldGroupId = 0;
    if (!NumberText::ParseUnsigned64(working[level - 1], worldGroupId)) {
        Log::Write(logger.Get(), Log::kWarning, "failed to convert %1 to int", Log::Str{working[level - 1]});
        return;
    }
    unsigned long long handle = 0;
    {
        KELIdMapper mapper;
        if (!mapper.GetVscsiId(worldGroupId, requested[level], handle)) return;
    }
    working[level] = NumberText::FormatUnsigned64(handle);
    GetStatValue(statIds, statId, node, requested, working, level + 1, values);
}

}  // namespace StatsRegistry
