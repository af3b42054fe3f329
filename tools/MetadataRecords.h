// The stats' metadata records, as the kernel publishes them in the sysinfo tree.
//
// Every stat has a ".metadata" leaf in the stat subtree whose `statLink` names the stat and whose
// record type is StatsRegistry_Metadata. MetadataRecord builds that record from the catalogue
// (name, codes, label, description, localization and the stat's catalogue attributes), laid out
// through the schema's member tables, so its bytes follow the exported type exactly; strings are
// cut to their field and NUL-padded, unused attribute slots are zero.
//
// Guarantees: AddMetadataRecords stores one record per metadata leaf that takes no instance key
// and declares StatsRegistry_Metadata; other nodes are left alone. Throws what Tree::SetRecord
// throws (std::invalid_argument), which the schema's rules rule out.
#pragma once

#include <cstdint>
#include <vector>

#include "TarnCtl/SimTree.h"

namespace Tool {

// The StatsRegistry_Metadata record of stat `statId`; empty when the schema lacks the type.
// REQUIRES: statId < statIdMax.
std::vector<uint8_t> MetadataRecord(long statId);

void AddMetadataRecords(TarnCtl::Sim::Tree& tree);

}  // namespace Tool
