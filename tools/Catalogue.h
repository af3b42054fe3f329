// The stats as the tool names them: the library's stat list plus the catalogue's object types.
//
// A Catalogue holds the StatDef list that GetStatsList returned (it must hold one StatDef per
// stat id, in id order) and resolves what a user types for a stat: a decimal stat id, a
// "name@objectType" pair (the object type text compared without regard to case), or a name that
// only one stat carries.
//
// Throws: Resolve throws UsageError naming what was wrong: an id out of range, an unknown object
// type, a name that no stat or no stat of that object type carries, or an ambiguous name (the
// message lists every candidate as name@objectType with its id).
// Ownership: the Catalogue keeps references to the StatDef records it was given.
#pragma once

#include <string>
#include <vector>

#include "Plinth/Ref.h"
#include "tarnstats/StatRecords.h"

namespace Tool {

class Catalogue {
public:
    // THROWS std::logic_error when `defs` does not hold the stats 0 to N - 1 in order.
    explicit Catalogue(Plinth::RefVector<StatsRegistry::StatDef> defs);

    std::size_t Size() const noexcept { return defs_.size(); }
    // REQUIRES: id < Size().
    const StatsRegistry::StatDef& Def(long id) const { return *defs_[static_cast<std::size_t>(id)]; }
    int32_t ObjectType(long id) const;        // the catalogue's SRStatObjectType code
    std::string ObjectTypeName(long id) const;  // its text, e.g. "vNic"
    std::string QualifiedName(long id) const;   // "net.throughput.usage@vNic"
    std::vector<std::string> AttributeNames(long id) const;

    // THROWS UsageError (see above).
    long Resolve(const std::string& text) const;

private:
    Plinth::RefVector<StatsRegistry::StatDef> defs_;
};

}  // namespace Tool
