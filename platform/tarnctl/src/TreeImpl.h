// Internal: the data of a Tree, shared by its set-up, fault and read units.
//
// Everything the read path touches is immutable once set up, except the counters and the
// firing counts of limited faults, which are atomics.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "PathMap.h"
#include "TarnCtl/SimTree.h"

namespace TarnCtl {
namespace Sim {
namespace detail {

// The instances of one instance node below one path, in insertion order, in the form List
// hands them out.
struct InstanceList {
    std::vector<unsigned long long> numbers;  // integer-keyed nodes
    std::vector<std::string> names;           // string-keyed nodes
};

struct Present {};

// What is stored at one node.
struct NodeStore {
    PathMap<InstanceList> children;          // instance nodes: keyed by the path above the node
    PathMap<Present> instances;              // instance nodes: keyed by the full path, own key last
    PathMap<std::vector<uint8_t>> records;   // leaves: keyed by the full read path
};

struct alignas(64) CounterCell {
    std::atomic<uint64_t> binds{0};
    std::atomic<uint64_t> lists{0};
    std::atomic<uint64_t> gets{0};
};

struct FaultEntry {
    Fault fault;
    std::atomic<long> left{0};  // firings left when fault.times >= 0
};

constexpr uint8_t OpBit(Op op) noexcept { return static_cast<uint8_t>(1U << static_cast<unsigned>(op)); }

// The installed tree, or null.
const Tree* CurrentTree() noexcept;

// Throws what a fired throwing fault asks for.
[[noreturn]] void RaiseFault(const Fault& f);
// Applies a fired Get fault: throws for the throwing kinds, else returns how many of `bytes`
// bytes to copy.
std::size_t ApplyGetFault(const Fault& f, std::size_t bytes);

}  // namespace detail

struct Tree::Impl {
    std::vector<NodeInfo> nodes;
    // Per node: its instance levels from the top down (instance ancestors, then the node itself
    // when it is an instance node), and how many of them are ancestors.
    std::vector<std::vector<unsigned>> levels;
    std::vector<unsigned> ancestorCount;
    std::vector<detail::NodeStore> stores;
    std::unique_ptr<detail::CounterCell[]> counters;
    std::vector<std::unique_ptr<detail::FaultEntry>> faults;
    std::vector<uint8_t> faultOps;  // per node: OpBit of every op with a fault

    // Checks count and kinds of `path` against the first `need` levels of `node`; throws
    // KeelException (read) or std::invalid_argument (set-up) naming `op`.
    void CheckShape(const char* op, bool setup, unsigned node, unsigned need, const Key* path,
                    unsigned count) const;
    // Whether the first `n` keys of `path` name existing instances of the first `n` levels of
    // `node` (checks only the deepest, which implies the others).
    bool Exists(unsigned node, const Key* path, unsigned n) const noexcept;
    // The reason text for the first key of `path` that names no instance, or "" when all do.
    std::string MissingReason(unsigned node, const Key* path, unsigned n) const;
    // The first matching fault that still fires (taking one firing), or null.
    const Fault* Fire(Op op, unsigned node, const Key* path, unsigned count) const;
};

}  // namespace Sim
}  // namespace TarnCtl
