// The stats interface and its factory.
//
// KELStatsFactory::GetKELStats hands out a new stats object on every call. GetStatsList appends
// one StatDef per stat of the catalogue; GetStatValues answers StatInstance requests with
// StatInstanceValue results appended to the caller's list. Failures inside value retrieval are
// logged through the "KELStatsImpl" logger and drop only what they affect; allocation failures and
// kernel access exceptions that retrieval does not handle reach the caller.
//
// The two code caches (id-map type and data type per stat and attribute index) are filled once per
// process, completely, before they are visible, by the first GetStatsList or GetStatValues call.
// After that every operation only reads shared data: any number of threads may call at once.
#pragma once

#include <string>
#include <vector>

#include "Plinth/Object.h"
#include "Plinth/Ref.h"
#include "tarnstats/Export.h"
#include "tarnstats/StatRecords.h"

namespace StatsRegistry {

class TARNSTATS_EXPORT KELStats : public virtual Plinth::ObjectImpl {
public:
    virtual ~KELStats();
    virtual void GetStatsList(Plinth::RefVector<StatDef>& statDefs) = 0;
    virtual void GetStatValues(Plinth::RefVector<StatInstance> const& requests,
                               Plinth::RefVector<StatInstanceValue>& values) = 0;

    static bool IsVmMoidToWid(unsigned int idMapType);   // codes 1 and 2
    static bool IsVmMoid(unsigned int idMapType);        // code 3
    static bool IsVnicToPort(unsigned int idMapType);    // code 5
    // REQUIRES: the caches are filled, statId < statIdMax, attrIndex below the stat's attribute
    // count (IsPrevAttrVm: from 1). No check is made.
    static long GetIdMapType(long statId, unsigned int attrIndex);
    static long GetDataType(long statId, unsigned int attrIndex);
    static bool IsPrevAttrVm(long statId, unsigned int attrIndex);
    static std::string GetAttrType(unsigned int idMapType);  // "vm" for 1 and 2, else "unknown type"

    // Fills both caches from the catalogue unless that has been done; thread-safe, once per process.
    static void EnsureCodeCaches();

    static std::vector<std::vector<long>> _sStatAttrIdMapType;
    static std::vector<std::vector<long>> _sStatAttrDataType;
};

class TARNSTATS_EXPORT KELStatsFactory {
public:
    // Stores a reference to a new KELStatsImpl in `statsOut`, then releases what it held before.
    // THROWS whatever construction throws; `statsOut` is then unchanged.
    static void GetKELStats(Plinth::Ref<KELStats>& statsOut);
};

}  // namespace StatsRegistry
