#include <string>

#include "TarnCtl/Sysinfo.h"
#include "platform/LogGate.h"
#include "retrieval/NumberText.h"
#include "tarnstats/KELStatsImpl.h"

namespace StatsRegistry {

bool KELStatsImpl::PrepareKelPath(TarnCtl::Util::Sysinfo& accessor, long statId,
                                  std::vector<std::string> const& attrInstances, unsigned int count) {
    for (unsigned int i = 0; i < count; ++i) {
        // A VM moid level names a VM outside the sysinfo tree: no component, and the next level
        // still reads its own index.
        if (IsVmMoid(static_cast<unsigned int>(GetIdMapType(statId, i)))) continue;
        const long dataType = GetDataType(statId, i);
        if (dataType == SR_PARAMTYPE_STRING) {
            accessor.AddInstancePath(attrInstances[i]);
        } else if (dataType == SR_PARAMTYPE_INT) {
            long long value = 0;
            if (!NumberText::ParseSigned64(attrInstances[i], value)) {
                Log::Write(logger.Get(), Log::kWarning, "failed to convert %1 to int", Log::Str{attrInstances[i]});
                return false;
            }
            accessor.AddInstancePath(value);
        } else {
            Log::Write(logger.Get(), Log::kWarning, "unknown attribute data type: %1",
                       Log::Int{static_cast<int32_t>(dataType)});
            return false;
        }
    }
    return true;
}

}  // namespace StatsRegistry
