// Construction, set-up, counters and installation of the in-memory sysinfo tree.
#include <mutex>
#include <stdexcept>
#include <utility>

#include "Messages.h"
#include "TarnCtl/SimTree.h"
#include "TreeImpl.h"

namespace TarnCtl {
namespace Sim {

namespace {

std::mutex gInstallMutex;
std::shared_ptr<Tree> gInstalled;           // keeps the installed tree alive
std::atomic<const Tree*> gCurrent{nullptr};  // what accessors bind to

[[noreturn]] void BadTable(unsigned node, const std::string& reason) {
    throw std::invalid_argument("sysinfo node table: node " + std::to_string(node) + ": " + reason);
}

// Fills levels/ancestorCount of `node` and of every node on its way up that lacks them.
void ComputeLevels(Tree::Impl& impl, std::vector<bool>& done, unsigned node) {
    std::vector<unsigned> chain;  // nodes to fill, bottom up
    unsigned cur = node;
    while (!done[cur]) {
        chain.push_back(cur);
        if (cur == 0) {
            break;
        }
        if (chain.size() > impl.nodes.size()) {
            BadTable(node, "parent links form a cycle");
        }
        cur = static_cast<unsigned>(impl.nodes[cur].parent);
    }
    for (auto it = chain.rbegin(); it != chain.rend(); ++it) {
        const unsigned n = *it;
        std::vector<unsigned> lv;
        if (n != 0) {
            lv = impl.levels[static_cast<unsigned>(impl.nodes[n].parent)];
        }
        impl.ancestorCount[n] = static_cast<unsigned>(lv.size());
        if (impl.nodes[n].isInstance) {
            lv.push_back(n);
        }
        impl.levels[n] = std::move(lv);
        done[n] = true;
    }
}

}  // namespace

namespace detail {
const Tree* CurrentTree() noexcept { return gCurrent.load(std::memory_order_acquire); }
}  // namespace detail

Tree::Tree(std::vector<NodeInfo> nodes) : impl_(new Impl) {
    const std::size_t n = nodes.size();
    if (n == 0) {
        throw std::invalid_argument("sysinfo node table: no nodes");
    }
    if (nodes[0].parent != 0) {
        BadTable(0, "the root must be its own parent");
    }
    for (std::size_t i = 1; i < n; ++i) {
        const int32_t p = nodes[i].parent;
        if (p < 0 || static_cast<std::size_t>(p) >= n) {
            BadTable(static_cast<unsigned>(i), "parent " + std::to_string(p) + " out of range");
        }
        if (nodes[static_cast<std::size_t>(p)].isLeaf) {
            BadTable(static_cast<unsigned>(i), "parent " + std::to_string(p) + " is a leaf");
        }
    }
    impl_->nodes = std::move(nodes);
    impl_->levels.resize(n);
    impl_->ancestorCount.resize(n);
    std::vector<bool> done(n, false);
    for (std::size_t i = 0; i < n; ++i) {
        ComputeLevels(*impl_, done, static_cast<unsigned>(i));
    }
    impl_->stores.resize(n);
    impl_->counters.reset(new detail::CounterCell[n]);
    impl_->faultOps.assign(n, 0);
}

Tree::~Tree() = default;

unsigned Tree::NodeCount() const noexcept { return static_cast<unsigned>(impl_->nodes.size()); }

const NodeInfo& Tree::Node(unsigned node) const { return impl_->nodes.at(node); }

unsigned Tree::ListKeyCount(unsigned node) const { return impl_->ancestorCount.at(node); }

unsigned Tree::GetKeyCount(unsigned node) const { return static_cast<unsigned>(impl_->levels.at(node).size()); }

void Tree::AddInstance(unsigned node, const Path& above, const Key& key) {
    const char* op = "AddInstance";
    if (node >= NodeCount()) {
        detail::ThrowInvalid(op, node, nullptr, above.data(), static_cast<unsigned>(above.size()),
                             "node number out of range");
    }
    const NodeInfo& info = impl_->nodes[node];
    const unsigned count = static_cast<unsigned>(above.size());
    if (!info.isInstance) {
        detail::ThrowInvalid(op, node, &info, above.data(), count, "node is not an instance node");
    }
    impl_->CheckShape(op, true, node, impl_->ancestorCount[node], above.data(), count);
    if (!impl_->Exists(node, above.data(), count)) {
        detail::ThrowInvalid(op, node, &info, above.data(), count, impl_->MissingReason(node, above.data(), count));
    }
    if (key.isInteger != info.isIntegerInstance) {
        detail::ThrowInvalid(op, node, &info, above.data(), count,
                             "new key " + detail::KeyText(key) + " is " + detail::KindText(key.isInteger) +
                                 ", but the node takes " + detail::KindText(info.isIntegerInstance) + " keys");
    }
    Path full = above;
    full.push_back(key);
    detail::NodeStore& store = impl_->stores[node];
    if (store.instances.Contains(full.data(), count + 1)) {
        return;
    }
    detail::InstanceList& list = store.children.Emplace(above.data(), count);
    if (key.isInteger) {
        list.numbers.push_back(key.number);
    } else {
        list.names.push_back(key.text);
    }
    store.instances.Emplace(full.data(), count + 1);
}

namespace {
// Checks shared by SetRecord and RemoveRecord.
void CheckRecordPath(const Tree::Impl& impl, const char* op, unsigned node, const Path& path) {
    const unsigned count = static_cast<unsigned>(path.size());
    if (node >= impl.nodes.size()) {
        detail::ThrowInvalid(op, node, nullptr, path.data(), count, "node number out of range");
    }
    const NodeInfo& info = impl.nodes[node];
    if (!info.isLeaf) {
        detail::ThrowInvalid(op, node, &info, path.data(), count, "node is not a leaf");
    }
    impl.CheckShape(op, true, node, static_cast<unsigned>(impl.levels[node].size()), path.data(), count);
    if (!impl.Exists(node, path.data(), count)) {
        detail::ThrowInvalid(op, node, &info, path.data(), count, impl.MissingReason(node, path.data(), count));
    }
}
}  // namespace

void Tree::SetRecord(unsigned node, const Path& path, std::vector<uint8_t> bytes) {
    CheckRecordPath(*impl_, "SetRecord", node, path);
    impl_->stores[node].records.Emplace(path.data(), static_cast<unsigned>(path.size())) = std::move(bytes);
}

void Tree::RemoveRecord(unsigned node, const Path& path) {
    CheckRecordPath(*impl_, "RemoveRecord", node, path);
    impl_->stores[node].records.Erase(path.data(), static_cast<unsigned>(path.size()));
}

Counters Tree::NodeCounters(unsigned node) const {
    if (node >= NodeCount()) {
        throw std::out_of_range("sysinfo node " + std::to_string(node) + " out of range");
    }
    const detail::CounterCell& c = impl_->counters[node];
    return Counters{c.binds.load(std::memory_order_relaxed), c.lists.load(std::memory_order_relaxed),
                    c.gets.load(std::memory_order_relaxed)};
}

Counters Tree::TotalCounters() const {
    Counters total;
    for (unsigned i = 0; i < NodeCount(); ++i) {
        const Counters c = NodeCounters(i);
        total.binds += c.binds;
        total.lists += c.lists;
        total.gets += c.gets;
    }
    return total;
}

void Tree::ResetCounters() {
    for (unsigned i = 0; i < NodeCount(); ++i) {
        detail::CounterCell& c = impl_->counters[i];
        c.binds.store(0, std::memory_order_relaxed);
        c.lists.store(0, std::memory_order_relaxed);
        c.gets.store(0, std::memory_order_relaxed);
    }
}

void Tree::OnBind(unsigned node) const { impl_->counters[node].binds.fetch_add(1, std::memory_order_relaxed); }

void Install(std::shared_ptr<Tree> tree) {
    std::lock_guard<std::mutex> lock(gInstallMutex);
    gCurrent.store(tree.get(), std::memory_order_release);
    gInstalled = std::move(tree);
}

std::shared_ptr<Tree> Installed() {
    std::lock_guard<std::mutex> lock(gInstallMutex);
    return gInstalled;
}

}  // namespace Sim
}  // namespace TarnCtl
