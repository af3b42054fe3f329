#include <map>
#include <string>
#include <vector>

#include "platform/LogGate.h"
#include "retrieval/NumberText.h"
#include "retrieval/UniqueStatKelPath.h"
#include "tarnstats/KELStatsImpl.h"
#include "tarnstats/StatCatalogue.h"

namespace StatsRegistry {

UniqueStatKelPath::~UniqueStatKelPath() = default;

std::string UniqueStatKelPath::GetUniqueKey(unsigned int node, std::vector<std::string> const& attrInstances) {
    size_t length = 10;
    for (const auto& instance : attrInstances) length += 1 + instance.size();
    std::string key;
    key.reserve(length);
    NumberText::AppendUnsigned64(key, node);
    for (const auto& instance : attrInstances) {
        key += '\n';
        key += instance;
    }
    return key;
}

void KELStatsImpl::GetStatValues(Plinth::RefVector<StatInstance> const& requests,
                                 Plinth::RefVector<StatInstanceValue>& values) {
    EnsureCodeCaches();
    values.reserve(values.size() + requests.size());

    // Groups in key order. Lists that differ but join to the same key (a string holding a line
    // feed) share a key and stay separate groups, in the order they first appeared.
    std::multimap<std::string, UniqueStatKelPath> groups;
    for (size_t index = 0; index < requests.size(); ++index) {
        const StatInstance* request = requests[index].Get();
        if (request == nullptr) {
            Log::Write(logger.Get(), Log::kWarning, "empty request reference at index %1 skipped",
                       Log::UInt{static_cast<uint32_t>(index)});
            continue;
        }
        const long statId = request->statId;
        if (statId < 0 || statId >= static_cast<long>(statIdMax)) {
            Log::Write(logger.Get(), Log::kWarning, "invalid statId: %1; expect [%2, %3)",
                       Log::UInt{static_cast<uint32_t>(statId)}, Log::Int{0}, Log::UInt{statIdMax});
            continue;
        }
        const size_t attributes = _sStatAttrIdMapType[static_cast<size_t>(statId)].size();
        if (request->attrInstances.size() != attributes) {
            Log::Write(logger.Get(), Log::kWarning, "request for stat %1 has %2 instances, expect %3",
                       Log::Int{static_cast<int32_t>(statId)},
                       Log::UInt{static_cast<uint32_t>(request->attrInstances.size())},
                       Log::UInt{static_cast<uint32_t>(attributes)});
            continue;
        }

        const unsigned int node = statIdMap[statId];
        std::string key = UniqueStatKelPath::GetUniqueKey(node, request->attrInstances);
        auto range = groups.equal_range(key);
        auto group = range.first;
        while (group != range.second && group->second.attrInstances != request->attrInstances) ++group;
        if (group != range.second) {
            group->second.statIds.insert(statId);
        } else {
            groups.emplace_hint(range.second, std::move(key), UniqueStatKelPath(node, request->attrInstances, statId));
        }
    }

    for (const auto& entry : groups) {
        const UniqueStatKelPath& group = entry.second;
        std::vector<std::string> working(group.attrInstances);
        GetStatValue(group.statIds, *group.statIds.begin(), group.node, group.attrInstances, working, 0, values);
    }
}

}  // namespace StatsRegistry
