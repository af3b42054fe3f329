// The sysinfo schema as the tool shows it: nodes named by id or path, subtrees, instance levels.
//
// A node is named by its decimal id or by its path of names from the root, such as
// "statsRegistry/virtualDisk" or "/worldGroups/vscsi/name" (a leading '/', a leading "root" and
// empty elements are ignored; "/" alone is the root). The subtree listing shows one node per line,
// indented by depth, children in ascending id: "<id> <name>" with '/' after a branch's name, the
// instance kind ("[int instance]" or "[str instance]"), and for a typed node its record type,
// "<type> (<size> bytes)", and any input type.
//
// Throws: ResolveNode throws UsageError for an id out of range or a path that names no node (the
// message names the first missing element and its parent).
// Guarantees: reads only the exported schema tables; walks are bounded by kelMaxNodes.
#pragma once

#include <ostream>
#include <string>
#include <vector>

namespace Tool {

// THROWS UsageError (see above).
unsigned ResolveNode(const std::string& text);

// "/statsRegistry/virtualDisk"; "/" for the root.
std::string NodePath(unsigned node);

// The children of `node` in ascending id.
std::vector<unsigned> Children(unsigned node);

// The instance nodes whose keys a read of `node` needs, from the top down (the node itself
// included when it is an instance node).
std::vector<unsigned> InstanceLevels(unsigned node);

// The name of a type index, or "" for -1 or an index out of range.
std::string TypeName(int32_t type);

// Prints `node` (with its full path) and, unless `depth` is 0, its subtree down to `depth`
// levels below it (-1: all).
void PrintSubtree(std::ostream& out, unsigned node, int depth = -1);

}  // namespace Tool
