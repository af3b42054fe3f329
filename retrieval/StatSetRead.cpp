#include <cstdlib>
#include <cstring>

#include "Keel/KeelException.h"
#include "TarnCtl/Sysinfo.h"
#include "idmap/KELIdMapper.h"
#include "platform/LogGate.h"
#include "retrieval/GetStructWrapper.h"
#include "retrieval/NumberText.h"
#include "tarnstats/KELStatsImpl.h"
#include "tarnstats/StatCatalogue.h"

namespace StatsRegistry {

GetStructWrapper::GetStructWrapper(long size_) {
    if (size_ <= 0) return;
    buffer = std::malloc(static_cast<size_t>(size_));
    if (buffer != nullptr) {
        std::memset(buffer, 0, static_cast<size_t>(size_));
        size = static_cast<int32_t>(size_);
    }
}

GetStructWrapper::~GetStructWrapper() {
    if (buffer != nullptr) {
        std::free(buffer);
        buffer = nullptr;
    }
}

namespace {

constexpr unsigned kHeaderSize = 4;  // numStats
constexpr unsigned kEntrySize = 16;  // id (u64), value (s64)

// Entries the record has room for: the stat set's member count, 1 for a stat without a set.
unsigned RecordCapacity(long statId) {
    const int32_t setId = statMetadataTab[statId].statSetId;
    return setId == -1 ? 1u : statSetTab[setId].numStats;
}

uint32_t LoadU32(const unsigned char* p) {
    uint32_t v;
    std::memcpy(&v, p, sizeof v);
    return v;
}
uint64_t LoadU64(const unsigned char* p) {
    uint64_t v;
    std::memcpy(&v, p, sizeof v);
    return v;
}

}  // namespace

bool KELStatsImpl::RetrieveStatValues(std::set<long> const& statIds, long statId, unsigned int node,
                                      std::vector<std::string> const& attrInstances,
                                      Plinth::RefVector<StatInstanceValue>& values) {
    const unsigned capacity = RecordCapacity(statId);
    TarnCtl::Util::Sysinfo accessor(node);
    if (!attrInstances.empty() &&
        !PrepareKelPath(accessor, statId, attrInstances, static_cast<unsigned int>(attrInstances.size()))) {
        return false;
    }

    const unsigned length = kEntrySize * capacity + kHeaderSize;
    GetStructWrapper record(static_cast<long>(length));
    if (record.buffer == nullptr) {
        Log::Write(logger.Get(), Log::kError, "failed to allocate SR GetStruct");
        return false;
    }
    std::memset(record.buffer, 0, length);
    try {
        accessor.Get(record.buffer, length);
    } catch (Keel::Lib::KeelException& e) {
        const std::string text = e.GetMessage(0);
        Log::Write(logger.Get(), Log::kWarning, "failed to get kel stat set: %1", Log::Str{text});
        return false;
    }

    // The results carry device names where the kernel keys the level by vSCSI handle.
    std::vector<std::string> instances(attrInstances);
    for (unsigned int i = 0; i < instances.size(); ++i) {
        if (GetIdMapType(statId, i) != SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE) continue;
        if (i == 0 || !IsPrevAttrVm(statId, i)) {
            Log::Write(logger.Get(), Log::kWarning, "no VM attr before vSCSI(%1:%2)",
                       Log::Int{static_cast<int32_t>(statId)}, Log::UInt{i});
            return false;
        }
        unsigned long long worldGroupId = 0;
        if (!NumberText::ParseUnsigned64(attrInstances[i - 1], worldGroupId)) {
            Log::Write(logger.Get(), Log::kWarning, "failed to convert %1 to int", Log::Str{attrInstances[i - 1]});
            return false;
        }
        unsigned long long handle = 0;
        if (!NumberText::ParseUnsigned64(attrInstances[i], handle)) {
            Log::Write(logger.Get(), Log::kWarning, "failed to convert id %1 to int", Log::Str{attrInstances[i]});
            return false;
        }
        KELIdMapper mapper;
        std::string name;
        if (!mapper.GetVscsiName(worldGroupId, handle, name)) return false;
        instances[i] = std::move(name);
    }

    const auto* bytes = static_cast<const unsigned char*>(record.buffer);
    uint32_t numStats = LoadU32(bytes);
    if (numStats > capacity) {
        // The count claims more entries than the record has room for: decode only those it holds.
        Log::Write(logger.Get(), Log::kWarning, "stat set record of node %1 counts %2 stats, room for %3",
                   Log::UInt{node}, Log::UInt{numStats}, Log::UInt{capacity});
        numStats = capacity;
    }
    for (uint32_t j = 0; j < numStats; ++j) {
        const unsigned char* entry = bytes + kHeaderSize + kEntrySize * j;
        const uint64_t id = LoadU64(entry);
        // Stat ids are 32-bit: an id with any of its upper 32 bits set names no stat of the
        // catalogue and is skipped like any unrequested id (it must not alias a low id).
        if ((id >> 32) != 0) continue;
        const long entryStatId = static_cast<int32_t>(static_cast<uint32_t>(id));
        if (statIds.find(entryStatId) == statIds.end()) continue;

        Plinth::Ref<StatInstanceValue> result(new StatInstanceValue);
        result->statInstance.Assign(new StatInstance(entryStatId, instances));
        result->value = static_cast<int64_t>(LoadU64(entry + 8));
        values.push_back(std::move(result));
    }
    return true;
}

}  // namespace StatsRegistry
