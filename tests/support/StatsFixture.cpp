#include "StatsFixture.h"

#include <cstring>

namespace TestSupport {

std::vector<uint8_t> Record(uint32_t numStats, const std::vector<std::pair<uint64_t, int64_t>>& entries) {
    std::vector<uint8_t> bytes(4 + 16 * entries.size(), 0);
    std::memcpy(bytes.data(), &numStats, 4);
    for (size_t j = 0; j < entries.size(); ++j) {
        std::memcpy(bytes.data() + 4 + 16 * j, &entries[j].first, 8);
        std::memcpy(bytes.data() + 4 + 16 * j + 8, &entries[j].second, 8);
    }
    return bytes;
}

}  // namespace TestSupport
