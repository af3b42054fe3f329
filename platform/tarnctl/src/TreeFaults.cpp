// Path checks shared by set-up and reads, and fault injection.
#include <stdexcept>

#include "Keel/KeelException.h"
#include "Messages.h"
#include "TreeImpl.h"

namespace TarnCtl {
namespace Sim {

void Tree::Impl::CheckShape(const char* op, bool setup, unsigned node, unsigned need, const Key* path,
                            unsigned count) const {
    auto fail = [&](const std::string& reason) {
        if (setup) {
            detail::ThrowInvalid(op, node, &nodes[node], path, count, reason);
        }
        detail::ThrowKeel(op, node, &nodes[node], path, count, reason);
    };
    if (count > Util::Sysinfo::kMaxPathKeys) {
        fail("more than " + std::to_string(Util::Sysinfo::kMaxPathKeys) + " instance keys given");
    }
    if (count != need) {
        fail("takes " + std::to_string(need) + " instance key" + (need == 1 ? "" : "s") + ", " +
             std::to_string(count) + " given");
    }
    const std::vector<unsigned>& lv = levels[node];
    for (unsigned i = 0; i < count; ++i) {
        const NodeInfo& level = nodes[lv[i]];
        if (path[i].isInteger != level.isIntegerInstance) {
            fail("key " + std::to_string(i) + " (" + detail::KeyText(path[i]) + ") is " +
                 detail::KindText(path[i].isInteger) + ", but level " + detail::NodeText(lv[i], &level) +
                 " takes " + detail::KindText(level.isIntegerInstance) + " keys");
        }
    }
}

bool Tree::Impl::Exists(unsigned node, const Key* path, unsigned n) const noexcept {
    if (n == 0) {
        return true;
    }
    return stores[levels[node][n - 1]].instances.Contains(path, n);
}

std::string Tree::Impl::MissingReason(unsigned node, const Key* path, unsigned n) const {
    const std::vector<unsigned>& lv = levels[node];
    for (unsigned i = 0; i < n; ++i) {
        if (!stores[lv[i]].instances.Contains(path, i + 1)) {
            return "key " + std::to_string(i) + " (" + detail::KeyText(path[i]) + ") names no instance of " +
                   detail::NodeText(lv[i], &nodes[lv[i]]) + " below " + PathText(path, i);
        }
    }
    return std::string();
}

const Fault* Tree::Impl::Fire(Op op, unsigned node, const Key* path, unsigned count) const {
    if ((faultOps[node] & detail::OpBit(op)) == 0) {
        return nullptr;
    }
    for (const auto& entry : faults) {
        const Fault& f = entry->fault;
        if (f.op != op || f.node != node) {
            continue;
        }
        if (!f.anyPath && (path == nullptr || !detail::SamePath(f.path, path, count))) {
            continue;
        }
        if (f.times >= 0) {
            long left = entry->left.load(std::memory_order_relaxed);
            bool taken = false;
            while (left > 0 && !taken) {
                taken = entry->left.compare_exchange_weak(left, left - 1, std::memory_order_relaxed);
            }
            if (!taken) {
                continue;
            }
        }
        return &f;
    }
    return nullptr;
}

void Tree::AddFault(Fault fault) {
    if (fault.node >= NodeCount()) {
        throw std::invalid_argument("fault on sysinfo node " + std::to_string(fault.node) + ": node out of range");
    }
    const bool copyKind = fault.kind == Fault::Kind::CopyNothing || fault.kind == Fault::Kind::CopyPrefix;
    if (copyKind && fault.op != Op::Get) {
        throw std::invalid_argument("fault on sysinfo node " + std::to_string(fault.node) +
                                    ": copy faults apply to Get only");
    }
    if (fault.times < -1) {
        throw std::invalid_argument("fault on sysinfo node " + std::to_string(fault.node) + ": times below -1");
    }
    auto entry = std::make_unique<detail::FaultEntry>();
    entry->left.store(fault.times, std::memory_order_relaxed);
    impl_->faultOps[fault.node] = static_cast<uint8_t>(impl_->faultOps[fault.node] | detail::OpBit(fault.op));
    entry->fault = std::move(fault);
    impl_->faults.push_back(std::move(entry));
}

void Tree::ClearFaults() {
    impl_->faults.clear();
    impl_->faultOps.assign(impl_->nodes.size(), 0);
}

namespace detail {

void RaiseFault(const Fault& f) {
    if (f.kind == Fault::Kind::ThrowOther) {
        throw std::runtime_error(f.text);
    }
    throw Keel::Lib::KeelException(f.text);
}

std::size_t ApplyGetFault(const Fault& f, std::size_t bytes) {
    switch (f.kind) {
        case Fault::Kind::CopyNothing:
            return 0;
        case Fault::Kind::CopyPrefix:
            return f.bytes < bytes ? f.bytes : bytes;
        default:
            RaiseFault(f);
    }
}

}  // namespace detail

void Tree::CheckFault(Op op, unsigned node, const Key* path, unsigned count) const {
    if (const Fault* f = impl_->Fire(op, node, path, count)) {
        detail::RaiseFault(*f);
    }
}

}  // namespace Sim
}  // namespace TarnCtl
