#include "tarnstats/StatRecords.h"

namespace StatsRegistry {

StatAttribute::StatAttribute(std::string name_, std::string attrType_, bool allowWildCard_, int32_t objectType_,
                             int32_t dataType_, int32_t idMapType_)
    : name(std::move(name_)),
      attrType(std::move(attrType_)),
      allowWildCard(allowWildCard_),
      objectType(objectType_),
      dataType(dataType_),
      idMapType(idMapType_) {}

StatAttribute::StatAttribute(StatAttribute const& other)
    : name(other.name),
      attrType(other.attrType),
      allowWildCard(other.allowWildCard),
      objectType(other.objectType),
      dataType(other.dataType),
      idMapType(other.idMapType) {}

StatAttribute::~StatAttribute() = default;
StatDef::~StatDef() = default;
StatInstance::~StatInstance() = default;
StatInstanceValue::~StatInstanceValue() = default;

}  // namespace StatsRegistry
