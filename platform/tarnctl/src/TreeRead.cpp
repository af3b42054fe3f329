// The read path of the in-memory sysinfo tree: List and Get with their checks.
//
// The common case (a valid path) costs the shape checks, one hash lookup and the copy; the
// search for the exact reason of a failure runs only when something is missing.
#include <cstring>

#include "Messages.h"
#include "TreeImpl.h"

namespace TarnCtl {
namespace Sim {

namespace {

// The checks and faults of a List; returns the instances to hand out (null: none).
const detail::InstanceList* Listed(const Tree::Impl& impl, unsigned node, const Key* path, unsigned count,
                                   bool asNumbers) {
    const char* op = "List";
    impl.counters[node].lists.fetch_add(1, std::memory_order_relaxed);
    const NodeInfo& info = impl.nodes[node];
    if (!info.isInstance) {
        detail::ThrowKeel(op, node, &info, path, count, "node is not an instance node");
    }
    impl.CheckShape(op, false, node, impl.ancestorCount[node], path, count);
    if (asNumbers != info.isIntegerInstance) {
        detail::ThrowKeel(op, node, &info, path, count,
                          std::string("node takes ") + detail::KindText(info.isIntegerInstance) +
                              " keys; list them as " + (info.isIntegerInstance ? "numbers" : "strings"));
    }
    const detail::InstanceList* list = impl.stores[node].children.Find(path, count);
    if (list == nullptr && !impl.Exists(node, path, count)) {
        detail::ThrowKeel(op, node, &info, path, count, impl.MissingReason(node, path, count));
    }
    if (const Fault* f = impl.Fire(Op::List, node, path, count)) {
        detail::RaiseFault(*f);  // AddFault lets only throwing kinds reach a List
    }
    return list;
}

}  // namespace

void Tree::ListStrings(unsigned node, const Key* path, unsigned count, std::vector<std::string>& out) const {
    const detail::InstanceList* list = Listed(*impl_, node, path, count, false);
    if (list == nullptr) {
        out.clear();
    } else {
        out.assign(list->names.begin(), list->names.end());
    }
}

void Tree::ListNumbers(unsigned node, const Key* path, unsigned count, std::vector<unsigned long long>& out) const {
    const detail::InstanceList* list = Listed(*impl_, node, path, count, true);
    if (list == nullptr) {
        out.clear();
    } else {
        out.assign(list->numbers.begin(), list->numbers.end());
    }
}

void Tree::Get(unsigned node, const Key* path, unsigned count, void* buffer, unsigned size) const {
    const char* op = "Get";
    const Impl& impl = *impl_;
    impl.counters[node].gets.fetch_add(1, std::memory_order_relaxed);
    const NodeInfo& info = impl.nodes[node];
    if (!info.isLeaf) {
        detail::ThrowKeel(op, node, &info, path, count, "node is not a leaf");
    }
    impl.CheckShape(op, false, node, static_cast<unsigned>(impl.levels[node].size()), path, count);
    if (size != info.outputSize) {
        detail::ThrowKeel(op, node, &info, path, count,
                          "size " + std::to_string(size) + " asked, the node's record size is " +
                              std::to_string(info.outputSize));
    }
    if (buffer == nullptr && size != 0) {
        detail::ThrowKeel(op, node, &info, path, count, "null buffer");
    }
    const std::vector<uint8_t>* record = impl.stores[node].records.Find(path, count);
    if (record == nullptr) {
        std::string reason = impl.MissingReason(node, path, count);
        detail::ThrowKeel(op, node, &info, path, count, reason.empty() ? "no record stored for this path" : reason);
    }
    std::size_t bytes = record->size() < size ? record->size() : size;
    if (const Fault* f = impl.Fire(Op::Get, node, path, count)) {
        bytes = detail::ApplyGetFault(*f, bytes);
    }
    if (bytes != 0) {
        std::memcpy(buffer, record->data(), bytes);
    }
}

}  // namespace Sim
}  // namespace TarnCtl
