// The sysinfo accessor of the bundled kernel control library, reading the installed tree.
#include "TarnCtl/Sysinfo.h"

#include <utility>

#include "Messages.h"
#include "TarnCtl/SimTree.h"
#include "TreeImpl.h"

namespace TarnCtl {
namespace Util {

Sysinfo::Sysinfo(unsigned int node) : tree_(Sim::detail::CurrentTree()), node_(node) {
    if (tree_ == nullptr) {
        Sim::detail::ThrowKeel("Bind", node, nullptr, path_, 0, "no sysinfo tree installed");
    }
    if (node >= tree_->NodeCount()) {
        Sim::detail::ThrowKeel("Bind", node, nullptr, path_, 0,
                               "node number out of range (the tree has " + std::to_string(tree_->NodeCount()) +
                                   " nodes)");
    }
    tree_->OnBind(node);
    tree_->CheckFault(Sim::Op::Bind, node, path_, 0);
}

Sysinfo::~Sysinfo() = default;

void Sysinfo::Push(bool isInteger, uint64_t number, std::string* text) {
    if (overflow_ || count_ == kMaxPathKeys) {
        tree_->CheckFault(Sim::Op::AddInstancePath, node_, nullptr, 0);
        overflow_ = true;
        return;
    }
    Key& key = path_[count_];
    key.isInteger = isInteger;
    key.number = number;
    if (text != nullptr) {
        key.text = std::move(*text);
    } else {
        key.text.clear();
    }
    tree_->CheckFault(Sim::Op::AddInstancePath, node_, path_, count_ + 1);
    ++count_;
}

void Sysinfo::AddInstancePath(std::string key) { Push(false, 0, &key); }

void Sysinfo::AddInstancePath(long long key) { Push(true, static_cast<uint64_t>(key), nullptr); }

void Sysinfo::AddInstancePath(unsigned long long key) { Push(true, key, nullptr); }

void Sysinfo::SetInstance(unsigned long long key) {
    const Sim::NodeInfo& info = tree_->Node(node_);
    const unsigned listKeys = tree_->ListKeyCount(node_);
    const unsigned getKeys = tree_->GetKeyCount(node_);
    if (!(info.isInstance && listKeys == 1) && !(info.isLeaf && getKeys == 1)) {
        std::string reason = "the node takes no single instance key (";
        if (info.isInstance) {
            reason += "List takes " + std::to_string(listKeys);
        } else {
            reason += "not an instance node";
        }
        reason += info.isLeaf ? ", Get takes " + std::to_string(getKeys) : std::string(", not a leaf");
        reason += ")";
        Sim::detail::ThrowKeel("SetInstance", node_, &info, path_, overflow_ ? kMaxPathKeys + 1 : count_, reason);
    }
    const Key single{true, key, {}};
    tree_->CheckFault(Sim::Op::SetInstance, node_, &single, 1);
    path_[0].isInteger = true;
    path_[0].number = key;
    path_[0].text.clear();
    count_ = 1;
    overflow_ = false;
}

void Sysinfo::List(std::vector<std::string>& instances) {
    tree_->ListStrings(node_, path_, overflow_ ? kMaxPathKeys + 1 : count_, instances);
}

void Sysinfo::List(std::vector<unsigned long long>& instances) {
    tree_->ListNumbers(node_, path_, overflow_ ? kMaxPathKeys + 1 : count_, instances);
}

void Sysinfo::Get(void* buffer, unsigned int size) {
    tree_->Get(node_, path_, overflow_ ? kMaxPathKeys + 1 : count_, buffer, size);
}

}  // namespace Util
}  // namespace TarnCtl
