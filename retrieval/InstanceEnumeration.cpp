#include <string>
#include <vector>

#include "Keel/KeelException.h"
#include "TarnCtl/Sysinfo.h"
#include "platform/LogGate.h"
#include "retrieval/NumberText.h"
#include "tarnstats/KELStatsImpl.h"
#include "tarnstats/SysinfoSchema.h"

namespace StatsRegistry {

bool KELStatsImpl::RetrieveKelStatAttrInstance(unsigned int node, long statId,
                                               std::vector<std::string> const& attrInstances, unsigned int attrIndex,
                                               std::vector<std::string>& instanceList) {
    // The instances of level k sit at the instance node n - k - 1 steps above the stat's node.
    const size_t levels = attrInstances.size();
    unsigned int listed = node;
    for (size_t step = attrIndex + 1; step < levels && listed < kelMaxNodes; ++step) {
        listed = static_cast<unsigned int>(kelNodesLookupTab[listed].parent);
    }

    TarnCtl::Util::Sysinfo accessor(listed);
    if (!attrInstances.empty() && !PrepareKelPath(accessor, statId, attrInstances, attrIndex)) return false;

    const long dataType = GetDataType(statId, attrIndex);
    instanceList.clear();
    try {
        if (dataType == SR_PARAMTYPE_STRING) {
            accessor.List(instanceList);
            return true;
        }
        if (dataType == SR_PARAMTYPE_INT) {
            std::vector<unsigned long long> numbers;
            accessor.List(numbers);
            instanceList.reserve(numbers.size());
            for (unsigned long long number : numbers) instanceList.push_back(NumberText::FormatUnsigned64(number));
            return true;
        }
    } catch (Keel::Lib::KeelException& e) {
        const std::string text = e.GetMessage(0);
        Log::Write(logger.Get(), Log::kWarning, "failed to list attribute instance: %1", Log::Str{text});
        Log::Write(logger.Get(), Log::kWarning, "stat Id: %1, index: %2, type: %3",
                   Log::Int{static_cast<int32_t>(statId)}, Log::UInt{attrIndex},
                   Log::Int{static_cast<int32_t>(dataType)});
        return false;
    }
    Log::Write(logger.Get(), Log::kWarning, "unknown attribute list data type");
    return false;
}

}  // namespace StatsRegistry
