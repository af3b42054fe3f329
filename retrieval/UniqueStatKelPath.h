// One group of requests: a sysinfo node, the instance list as requested, and every stat id asked
// for with that node and list.
//
// GetUniqueKey(node, attrInstances) gives the group key: the node in decimal, then for each
// instance string a line feed followed by the string. Two different lists can give the same key
// (a string holding a line feed); the grouping therefore also compares the lists themselves.
#pragma once

#include <set>
#include <string>
#include <vector>

#include "tarnstats/Export.h"

namespace StatsRegistry {

class TARNSTATS_EXPORT UniqueStatKelPath {
public:
    UniqueStatKelPath() = default;
    UniqueStatKelPath(unsigned int node_, std::vector<std::string> attrInstances_, long statId)
        : node(node_), attrInstances(std::move(attrInstances_)), statIds{statId} {}
    UniqueStatKelPath(const UniqueStatKelPath&) = default;
    UniqueStatKelPath(UniqueStatKelPath&&) noexcept = default;
    UniqueStatKelPath& operator=(const UniqueStatKelPath&) = default;
    UniqueStatKelPath& operator=(UniqueStatKelPath&&) noexcept = default;
    ~UniqueStatKelPath();

    static std::string GetUniqueKey(unsigned int node, std::vector<std::string> const& attrInstances);

    unsigned int node = 0;
    std::vector<std::string> attrInstances;
    std::set<long> statIds;
};

}  // namespace StatsRegistry
