// Internal: the failure texts of the tree and the accessor.
//
// Every text has the form
//   <op> of sysinfo node <n> "<name>" with path <path>: <reason>
// (without the name when the node is unknown), so that a log line alone tells which call failed.
// A count above Sysinfo::kMaxPathKeys prints the first kMaxPathKeys keys followed by ", ...".
#pragma once

#include <string>

#include "TarnCtl/SimTree.h"

namespace TarnCtl {
namespace Sim {
namespace detail {

// One key as PathText prints it: 42 or "disk1".
std::string KeyText(const Key& key);
// "integer" or "string".
const char* KindText(bool isInteger) noexcept;
// `node 12 "arg1"`; `info` may be null when the node is out of range.
std::string NodeText(unsigned node, const NodeInfo* info);

std::string FailureText(const char* op, unsigned node, const NodeInfo* info, const Key* path, unsigned count,
                        const std::string& reason);

[[noreturn]] void ThrowKeel(const char* op, unsigned node, const NodeInfo* info, const Key* path, unsigned count,
                            const std::string& reason);
[[noreturn]] void ThrowInvalid(const char* op, unsigned node, const NodeInfo* info, const Key* path, unsigned count,
                               const std::string& reason);

}  // namespace detail
}  // namespace Sim
}  // namespace TarnCtl
