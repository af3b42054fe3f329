#include "Plinth/Object.h"

namespace Plinth {
namespace {
std::atomic<long> gLiveObjects{0};
}

ObjectImpl::ObjectImpl() noexcept : refCount_(0) { gLiveObjects.fetch_add(1, std::memory_order_relaxed); }

ObjectImpl::ObjectImpl(const ObjectImpl&) noexcept : Object(), refCount_(0) {
    gLiveObjects.fetch_add(1, std::memory_order_relaxed);
}

ObjectImpl::~ObjectImpl() { gLiveObjects.fetch_sub(1, std::memory_order_relaxed); }

void ObjectImpl::IncRef() const {
    if (refCount_.fetch_add(1, std::memory_order_relaxed) == 0) {
        const_cast<ObjectImpl*>(this)->FirstIncRef(typeid(*this));
    }
}

void ObjectImpl::DecRef() const {
    if (refCount_.fetch_sub(1, std::memory_order_acq_rel) == 1) {
        const_cast<ObjectImpl*>(this)->FinalDecRef(typeid(*this));
    }
}

std::string ObjectImpl::ToString() { return typeid(*this).name(); }

int ObjectImpl::GetRefCount() const { return refCount_.load(std::memory_order_relaxed); }

void ObjectImpl::FirstIncRef(std::type_info const&) {}

void ObjectImpl::FinalDecRef(std::type_info const&) { delete this; }

long ObjectImpl::LiveObjects() noexcept { return gLiveObjects.load(std::memory_order_relaxed); }

}  // namespace Plinth
