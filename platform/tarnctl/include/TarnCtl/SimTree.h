// The in-memory sysinfo tree behind the bundled kernel control library.
//
// A Tree is built from a node table (the fields of the schema's node records that the kernel
// needs) and then filled through its set-up API: instances at instance nodes below a given
// instance path, and raw records (any bytes, any length) at leaves for a full instance path.
// Once installed with Install, every Sysinfo accessor of the process reads it.
//
// Keys. The instance levels of a node are the instance nodes on its way up to the root, read from
// the top down. List needs one key per instance level strictly above the node; Get needs one key
// per level from the top down to the node, the node itself included when it is an instance node.
// A level with isIntegerInstance takes integer keys, any other instance level string keys.
//
// Strictness (each failure throws Keel::Lib::KeelException naming the operation, the node by
// number and name, and the path as PathText prints it):
// - List needs an instance node and exactly one key for each instance node above it, each of the
//   kind that level takes (integer or string), each naming an existing instance; the string form
//   of List is for string-keyed nodes and the number form for integer-keyed ones. An existing
//   path with no instances added below it lists empty.
// - Get needs a leaf and one key for each instance node from the top down to the leaf, the leaf
//   included when it is an instance node, each of the right kind and naming an existing instance;
//   the size asked must equal the node's output size, the buffer must not be null (unless the
//   size is 0) and the record must exist. A stored record shorter than asked is copied as far as
//   it goes and the rest of the buffer is left alone; a longer one is cut at the size asked.
// - A path of more than Sysinfo::kMaxPathKeys keys fails every List and Get.
// - SetInstance needs a node that takes exactly one key (see Sysinfo.h); checked at once.
// - A node number out of range, or no tree installed, fails at bind.
// Checks come first, faults second: a fault only replaces the outcome of an operation that
// passed its checks (Bind: a node in range; AddInstancePath: none; SetInstance: the key count).
//
// Fault injection: a chosen operation on a chosen node (optionally only for one exact path,
// optionally only a number of times) throws KeelException with a given text, throws
// std::runtime_error, or (Get only) copies nothing or only a given number of bytes. When several
// faults match, the first one added that still has firings left fires.
//
// Counters per node, kept with relaxed atomics: binds (every accessor bound to the node), lists
// and gets (every call on an accessor of the node, whatever its outcome).
//
// Thread safety: set-up, faults and ResetCounters are not thread-safe against readers of the
// same tree; once set up, any number of threads may read the tree at once (the
// read path changes nothing but the counters and the firing counts of limited faults, which are
// atomic). Install and Installed may be called from any thread; a tree that is replaced while
// accessors still read it must be kept alive by the caller.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "TarnCtl/Sysinfo.h"

namespace TarnCtl {
namespace Sim {

// What the tree needs to know of one node.
struct NodeInfo {
    bool isLeaf = false;
    bool isInstance = false;
    bool isIntegerInstance = false;
    int32_t parent = 0;        // the root is its own parent
    uint32_t outputSize = 0;   // record size of a leaf
    std::string name;          // for messages
};

using Key = Util::Sysinfo::Key;
using Path = std::vector<Key>;

inline Key IntKey(uint64_t n) { return Key{true, n, {}}; }
inline Key StrKey(std::string s) { return Key{false, 0, std::move(s)}; }

enum class Op { Bind, AddInstancePath, SetInstance, List, Get };

struct Fault {
    enum class Kind {
        ThrowKeel,     // throw KeelException(text)
        ThrowOther,    // throw std::runtime_error(text)
        CopyNothing,   // Get returns without writing the buffer
        CopyPrefix,    // Get writes only the first `bytes` bytes (at most the record and the size)
    };
    Op op = Op::Get;
    unsigned node = 0;
    // false: only when the accessor's path equals `path`; for AddInstancePath that is the path
    // with the new key appended, for SetInstance the single new key, for Bind the empty path.
    // A path that has overflowed matches no path-bound fault.
    bool anyPath = true;
    Path path;
    Kind kind = Kind::ThrowKeel;
    std::string text = "injected fault";
    unsigned bytes = 0;        // CopyPrefix
    long times = -1;           // how many times it fires; -1 = always
};

struct Counters {
    uint64_t binds = 0;
    uint64_t lists = 0;
    uint64_t gets = 0;
};

class Tree {
public:
    // `nodes[i]` describes node i; node 0 is the root.
    // THROWS std::invalid_argument when the table is empty, node 0 is not its own parent, or a
    // parent link is out of range, names a leaf or does not lead to node 0.
    explicit Tree(std::vector<NodeInfo> nodes);
    ~Tree();
    Tree(const Tree&) = delete;
    Tree& operator=(const Tree&) = delete;

    unsigned NodeCount() const noexcept;
    // The three below THROW std::out_of_range for a node number out of range.
    const NodeInfo& Node(unsigned node) const;
    // Number of keys a List of `node` needs (its instance ancestors).
    unsigned ListKeyCount(unsigned node) const;
    // Number of keys a Get of `node` needs (ancestors, plus the node when it is an instance).
    unsigned GetKeyCount(unsigned node) const;

    // Set-up. `above` holds one key per instance ancestor of `node`, each naming an existing
    // instance. Adding an instance that exists already is a no-op. Listing order is insertion order.
    // THROWS std::invalid_argument on a bad node, path or key kind.
    void AddInstance(unsigned node, const Path& above, const Key& key);
    // Stores the record of leaf `node` for the full path `path` (replacing any earlier one).
    // `path` holds GetKeyCount(node) keys, each naming an existing instance.
    // THROWS std::invalid_argument on a bad node or path.
    void SetRecord(unsigned node, const Path& path, std::vector<uint8_t> bytes);
    // Removes that record; removing one that is not there does nothing.
    // THROWS std::invalid_argument on a bad node or path.
    void RemoveRecord(unsigned node, const Path& path);

    // THROWS std::invalid_argument for a node out of range, a copy kind on an operation other
    // than Get, or a `times` below -1.
    void AddFault(Fault fault);
    void ClearFaults();

    // THROWS std::out_of_range for a node out of range.
    Counters NodeCounters(unsigned node) const;
    Counters TotalCounters() const;
    void ResetCounters();

    // Used by the accessor; `node` is in range.
    void OnBind(unsigned node) const;
    // Throws what a matching Bind, AddInstancePath or SetInstance fault asks for. A null `path`
    // matches only faults for any path.
    void CheckFault(Op op, unsigned node, const Key* path, unsigned count) const;
    // Read path: the checks, faults and counting described above. `count` may exceed
    // Sysinfo::kMaxPathKeys to report an overflowed path (then only `kMaxPathKeys` keys are read).
    void ListStrings(unsigned node, const Key* path, unsigned count, std::vector<std::string>& out) const;
    void ListNumbers(unsigned node, const Key* path, unsigned count, std::vector<unsigned long long>& out) const;
    void Get(unsigned node, const Key* path, unsigned count, void* buffer, unsigned size) const;

    struct Impl;

private:
    std::unique_ptr<Impl> impl_;
};

// Makes `tree` the tree that every accessor reads (the process keeps a reference until the next
// Install); an empty pointer uninstalls it. Accessors bound before the call keep reading the tree
// they were bound to, which must outlive them: keep a reference of your own while they live.
void Install(std::shared_ptr<Tree> tree);
std::shared_ptr<Tree> Installed();

// Text of a path for messages, e.g. "[100, \"disk1\"]": integers in decimal, strings in double
// quotes with '"' and '\\' escaped by a backslash and other bytes outside 0x20-0x7e as \xNN.
std::string PathText(const Key* path, unsigned count);

}  // namespace Sim
}  // namespace TarnCtl
