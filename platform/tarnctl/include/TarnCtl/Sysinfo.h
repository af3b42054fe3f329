// Accessor for one node of the kernel's sysinfo tree.
//
// An accessor is bound to one node (its index in the schema's node table) and carries an instance
// path: one key for each instance level from the top of the tree down, added in that order.
// List fills a vector with the instances found directly below the prepared path (the node must
// be an instance level); Get copies the node's record for the prepared path into the caller's
// buffer (the node must be a leaf). Every operation reports failure by throwing
// Keel::Lib::KeelException whose text names the operation, the node (number and name) and the
// path; paths are checked by List and Get, not while they are built. (The one exception: a test
// may inject a fault that throws std::runtime_error instead, see SimTree.h.)
//
// The bundled library reads the in-memory tree installed with TarnCtl::Sim::Install
// (TarnCtl/SimTree.h), which also states the exact strictness rules and fault injection.
//
// Cost: binding and building a path of integer keys allocate nothing; a string key costs what
// its std::string costs. Get allocates nothing on success.
//
// Threads: an accessor belongs to one thread; any number of accessors may be used at once.
// Key and kMaxPathKeys belong to this bundled implementation; code meant to run against a host's
// own kernel control library must not use them.
// Ownership: the accessor does not own the tree; the tree it was bound to must outlive it.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace TarnCtl {
namespace Sim {
class Tree;
}
namespace Util {

class Sysinfo {
public:
    // Binds to `node` of the installed tree.
    // THROWS KeelException when no tree is installed or the node number is out of range
    // (or when a Bind fault fires).
    explicit Sysinfo(unsigned int node);
    ~Sysinfo();
    Sysinfo(const Sysinfo&) = delete;
    Sysinfo& operator=(const Sysinfo&) = delete;

    // Append one key to the instance path. A signed key is kept as the integer key with the same
    // 64-bit two's complement value. No check is made here; a path of more than kMaxPathKeys
    // keys is marked as overflowed and every later List or Get throws.
    // THROWS KeelException only when an AddInstancePath fault fires (the path is then unchanged).
    void AddInstancePath(std::string key);
    void AddInstancePath(long long key);
    void AddInstancePath(unsigned long long key);

    // Replaces the whole path (overflow included) with the single integer key `key`.
    // REQUIRES: the node takes exactly one key: it is an instance node with one instance level
    // above it (List takes one key), or a leaf whose read takes one key.
    // THROWS KeelException at once when it does not (the path is then unchanged); the key's kind
    // and existence are checked by List and Get as for any path.
    void SetInstance(unsigned long long key);

    // Replaces the content of `instances` with the keys listed at the node for the current path,
    // in the order they were added. The string form is for string-keyed levels, the number form
    // for integer-keyed ones.
    // THROWS KeelException on any failure; `instances` is then unchanged.
    void List(std::vector<std::string>& instances);
    void List(std::vector<unsigned long long>& instances);

    // Copies the node's record for the current path into `buffer`, whose size must equal the
    // node's record size. Writes at most `size` bytes; a shorter stored record leaves the rest
    // of the buffer as it was.
    // THROWS KeelException on any failure; nothing has been written then.
    void Get(void* buffer, unsigned int size);

    // One component of an instance path.
    struct Key {
        bool isInteger = false;
        uint64_t number = 0;
        std::string text;
    };
    static constexpr unsigned kMaxPathKeys = 8;

private:
    void Push(bool isInteger, uint64_t number, std::string* text);

    const Sim::Tree* tree_;
    unsigned int node_;
    unsigned int count_ = 0;
    bool overflow_ = false;
    Key path_[kMaxPathKeys];
};

}  // namespace Util
}  // namespace TarnCtl
