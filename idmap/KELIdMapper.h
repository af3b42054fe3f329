// Translation between a virtual disk's device name and its virtual SCSI handle within a world
// group, by asking the kernel every time (nothing is cached).
//
// Kernel nodes: 1314 "vscsi" lists a world group's handles (one integer key, the world group);
// 1315 "name" holds each handle's 16-byte device name (keys: world group, handle).
//
// GetVscsiName: on true `name` holds the handle's device name (the record's characters up to the
// first NUL, at most 16); on false a failure was logged and `name` is unchanged. The read buffer
// is zero-filled first, so a read that writes nothing gives an empty name.
// GetVscsiId: on true `vscsiHandle` holds the first listed handle whose name equals `name`
// exactly; on false a failure was logged and `vscsiHandle` is unchanged.
// Only KeelException from the name read and from the listing is caught (and logged at level 8
// through the "KELIdMapper" logger); anything else thrown while binding, building the path or
// copying passes to the caller with every accessor and list released.
// Concurrency: no member changes after construction; calls on one mapper may run at once.
#pragma once

#include <string>

#include "Plinth/Ref.h"
#include "Plinth/Service.h"
#include "tarnstats/Export.h"

namespace StatsRegistry {

class TARNSTATS_EXPORT KELIdMapper {
public:
    static constexpr unsigned int kVscsiNode = 1314;
    static constexpr unsigned int kVscsiNameNode = 1315;
    static constexpr unsigned int kNameSize = 16;

    // THROWS what fetching the logger throws.
    KELIdMapper();
    virtual ~KELIdMapper();
    KELIdMapper(const KELIdMapper&) = delete;
    KELIdMapper& operator=(const KELIdMapper&) = delete;

    bool GetVscsiName(unsigned long long worldGroupId, unsigned long long vscsiHandle, std::string& name);
    bool GetVscsiId(unsigned long long worldGroupId, std::string const& name, unsigned long long& vscsiHandle);

private:
    Plinth::Ref<Plinth::Service::Logger> logger;
};

}  // namespace StatsRegistry
