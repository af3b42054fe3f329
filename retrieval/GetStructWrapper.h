// Owner of the zero-filled C-allocator buffer that one stat set read fills.
//
// GetStructWrapper(size): for size >= 1 allocates `size` bytes with malloc and zero-fills them;
// `buffer` stays null when the allocation fails or size <= 0. The destructor frees a non-null
// buffer. Never copied; lives on the stack of one read.
#pragma once

#include <cstdint>

#include "tarnstats/Export.h"

namespace StatsRegistry {

class TARNSTATS_EXPORT GetStructWrapper {
public:
    explicit GetStructWrapper(long size);
    ~GetStructWrapper();
    GetStructWrapper(const GetStructWrapper&) = delete;
    GetStructWrapper& operator=(const GetStructWrapper&) = delete;

    void* buffer = nullptr;
    int32_t size = 0;
};

}  // namespace StatsRegistry
