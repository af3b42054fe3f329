// Internal: comparison and hashing of instance paths, and a hash map keyed by a whole path.
//
// PathMap looks entries up by a borrowed key array (pointer and count), so a lookup builds no
// Path and allocates nothing. Not thread-safe for writers; concurrent const lookups are safe.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <unordered_map>
#include <utility>

#include "TarnCtl/SimTree.h"

namespace TarnCtl {
namespace Sim {
namespace detail {

inline bool SameKey(const Key& a, const Key& b) noexcept {
    if (a.isInteger != b.isInteger) {
        return false;
    }
    return a.isInteger ? a.number == b.number : a.text == b.text;
}

inline bool SamePath(const Path& a, const Key* b, unsigned n) noexcept {
    if (a.size() != n) {
        return false;
    }
    for (unsigned i = 0; i < n; ++i) {
        if (!SameKey(a[i], b[i])) {
            return false;
        }
    }
    return true;
}

inline uint64_t Mix64(uint64_t x) noexcept {
    x ^= x >> 30;
    x *= 0xbf58476d1ce4e5b9ULL;
    x ^= x >> 27;
    x *= 0x94d049bb133111ebULL;
    x ^= x >> 31;
    return x;
}

inline uint64_t HashPath(const Key* path, unsigned n) noexcept {
    uint64_t h = 0x9e3779b97f4a7c15ULL + n;
    for (unsigned i = 0; i < n; ++i) {
        const Key& k = path[i];
        const uint64_t v = k.isInteger ? k.number : static_cast<uint64_t>(std::hash<std::string>()(k.text));
        h = Mix64(h ^ v) + (k.isInteger ? 1U : 2U);
    }
    return h;
}

template <class V>
class PathMap {
public:
    const V* Find(const Key* path, unsigned n) const noexcept {
        auto range = map_.equal_range(HashPath(path, n));
        for (auto it = range.first; it != range.second; ++it) {
            if (SamePath(it->second.path, path, n)) {
                return &it->second.value;
            }
        }
        return nullptr;
    }
    V* Find(const Key* path, unsigned n) noexcept {
        return const_cast<V*>(static_cast<const PathMap&>(*this).Find(path, n));
    }
    bool Contains(const Key* path, unsigned n) const noexcept { return Find(path, n) != nullptr; }

    // The entry for the path, inserted value-initialised when absent.
    V& Emplace(const Key* path, unsigned n) {
        if (V* found = Find(path, n)) {
            return *found;
        }
        Entry entry{Path(path, path + n), V()};
        return map_.emplace(HashPath(path, n), std::move(entry))->second.value;
    }

    // True when an entry was removed.
    bool Erase(const Key* path, unsigned n) {
        auto range = map_.equal_range(HashPath(path, n));
        for (auto it = range.first; it != range.second; ++it) {
            if (SamePath(it->second.path, path, n)) {
                map_.erase(it);
                return true;
            }
        }
        return false;
    }

    std::size_t Size() const noexcept { return map_.size(); }

private:
    struct Entry {
        Path path;
        V value;
    };
    struct Fold {
        std::size_t operator()(uint64_t h) const noexcept { return static_cast<std::size_t>(h ^ (h >> 32)); }
    };
    std::unordered_multimap<uint64_t, Entry, Fold> map_;
};

}  // namespace detail
}  // namespace Sim
}  // namespace TarnCtl
