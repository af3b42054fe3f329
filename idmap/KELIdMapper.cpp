#include "idmap/KELIdMapper.h"

#include <cstring>
#include <vector>

#include "Keel/KeelException.h"
#include "TarnCtl/Sysinfo.h"
#include "platform/LogGate.h"

namespace StatsRegistry {

KELIdMapper::KELIdMapper() { Plinth::Service::GetApp()->GetLogService()->GetLogger("KELIdMapper", logger); }

KELIdMapper::~KELIdMapper() = default;

bool KELIdMapper::GetVscsiName(unsigned long long worldGroupId, unsigned long long vscsiHandle, std::string& name) {
    TarnCtl::Util::Sysinfo accessor(kVscsiNameNode);
    accessor.AddInstancePath(worldGroupId);
    accessor.AddInstancePath(vscsiHandle);
    char buffer[kNameSize];
    std::memset(buffer, 0, sizeof buffer);  // a short or empty read gives a short or empty name
    try {
        accessor.Get(buffer, kNameSize);
    } catch (Keel::Lib::KeelException& e) {
        const std::string text = e.GetMessage(0);
        Log::Write(logger.Get(), Log::kWarning, "failed to get vscsi name for (%1:%2): %3", Log::ULong{worldGroupId},
                   Log::ULong{vscsiHandle}, Log::Str{text});
        return false;
    }
    name.assign(buffer, strnlen(buffer, kNameSize));
    return true;
}

bool KELIdMapper::GetVscsiId(unsigned long long worldGroupId, std::string const& name,
                             unsigned long long& vscsiHandle) {
    TarnCtl::Util::Sysinfo accessor(kVscsiNode);
    accessor.SetInstance(worldGroupId);
    std::vector<unsigned long long> handles;
    try {
        accessor.List(handles);
    } catch (Keel::Lib::KeelException& e) {
        const std::string text = e.GetMessage(0);
        Log::Write(logger.Get(), Log::kWarning, "failed to list vscsi id for (%1:%2): %3", Log::ULong{worldGroupId},
                   Log::Str{name}, Log::Str{text});
        return false;
    }
    std::string candidate;
    for (unsigned long long handle : handles) {
        if (GetVscsiName(worldGroupId, handle, candidate) && candidate == name) {
            vscsiHandle = handle;
            return true;
        }
    }
    Log::Write(logger.Get(), Log::kWarning, "failed to get vscsi id for (%1:%2)", Log::ULong{worldGroupId},
               Log::Str{name});
    return false;
}

}  // namespace StatsRegistry
