#include "tarnstats/KELStats.h"

#include "tarnstats/KELStatsImpl.h"

namespace StatsRegistry {

std::vector<std::vector<long>> KELStats::_sStatAttrIdMapType;
std::vector<std::vector<long>> KELStats::_sStatAttrDataType;

KELStats::~KELStats() = default;

bool KELStats::IsVmMoidToWid(unsigned int idMapType) {
    return idMapType == SR_IDMAPTYPE_VM_MOID_TO_WORLDID || idMapType == SR_IDMAPTYPE_VM_MOID_TO_WORLDGROUPID;
}

bool KELStats::IsVmMoid(unsigned int idMapType) { return idMapType == SR_IDMAPTYPE_VM_MOID; }

bool KELStats::IsVnicToPort(unsigned int idMapType) { return idMapType == SR_IDMAPTYPE_VNIC_TO_PORT_ID; }

long KELStats::GetIdMapType(long statId, unsigned int attrIndex) {
    return _sStatAttrIdMapType[static_cast<size_t>(statId)][attrIndex];
}

long KELStats::GetDataType(long statId, unsigned int attrIndex) {
    return _sStatAttrDataType[static_cast<size_t>(statId)][attrIndex];
}

bool KELStats::IsPrevAttrVm(long statId, unsigned int attrIndex) {
    const long code = GetIdMapType(statId, attrIndex - 1);
    return code == SR_IDMAPTYPE_VM_MOID_TO_WORLDID || code == SR_IDMAPTYPE_VM_MOID_TO_WORLDGROUPID ||
           code == SR_IDMAPTYPE_VM_MOID;
}

std::string KELStats::GetAttrType(unsigned int idMapType) { return IsVmMoidToWid(idMapType) ? "vm" : "unknown type"; }

void KELStatsFactory::GetKELStats(Plinth::Ref<KELStats>& statsOut) {
    // If the constructor throws, new-expression frees the memory and statsOut is untouched.
    KELStats* created = new KELStatsImpl();
    statsOut.Assign(created);
}

}  // namespace StatsRegistry
