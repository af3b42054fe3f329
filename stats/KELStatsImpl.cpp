#include "tarnstats/KELStatsImpl.h"

namespace StatsRegistry {

KELStatsImpl::KELStatsImpl() {
    Plinth::Service::GetApp()->GetLogService()->GetLogger("KELStatsImpl", logger);
}

KELStatsImpl::~KELStatsImpl() = default;

}  // namespace StatsRegistry
