// The implementation of the stats interface.
//
// Holds only its logger ("KELStatsImpl"); every call works from the catalogue, the code caches and
// its arguments. The non-virtual members are the steps of value retrieval; each returns false
// after logging why (see the retrieval headers for their contracts).
#pragma once

#include <set>
#include <string>
#include <vector>

#include "Plinth/Service.h"
#include "tarnstats/KELStats.h"

namespace TarnCtl {
namespace Util {
class Sysinfo;
}
}  // namespace TarnCtl

namespace StatsRegistry {

class TARNSTATS_EXPORT KELStatsImpl : public virtual KELStats {
public:
    // THROWS what fetching the logger throws.
    KELStatsImpl();
    ~KELStatsImpl() override;

    void GetStatsList(Plinth::RefVector<StatDef>& statDefs) override;
    void GetStatValues(Plinth::RefVector<StatInstance> const& requests,
                       Plinth::RefVector<StatInstanceValue>& values) override;

    // Appends one typed instance path component per attribute level below `count` (VM moid levels
    // add none). REQUIRES: attrInstances holds at least `count` entries; statId is valid.
    // Returns false after logging "failed to convert %1 to int" or "unknown attribute data type: %1".
    // THROWS what AddInstancePath throws.
    bool PrepareKelPath(TarnCtl::Util::Sysinfo& accessor, long statId,
                        std::vector<std::string> const& attrInstances, unsigned int count);

    // Lists the instances of level `attrIndex` below the levels fixed in attrInstances.
    bool RetrieveKelStatAttrInstance(unsigned int node, long statId, std::vector<std::string> const& attrInstances,
                                     unsigned int attrIndex, std::vector<std::string>& instanceList);

    // The attribute walk: expands wildcards, maps virtual disk names, reads each complete path.
    void GetStatValue(std::set<long> const& statIds, long statId, unsigned int node,
                      std::vector<std::string> const& requested, std::vector<std::string>& working,
                      unsigned int level, Plinth::RefVector<StatInstanceValue>& values);

    // Reads one stat set record for one concrete path and appends the requested entries.
    bool RetrieveStatValues(std::set<long> const& statIds, long statId, unsigned int node,
                            std::vector<std::string> const& attrInstances,
                            Plinth::RefVector<StatInstanceValue>& values);

    Plinth::Service::Logger* GetLogger() const noexcept { return logger.Get(); }

protected:
    Plinth::Ref<Plinth::Service::Logger> logger;
};

}  // namespace StatsRegistry
