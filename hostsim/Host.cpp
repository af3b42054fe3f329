#include "hostsim/Host.h"

#include <cstring>
#include <set>
#include <stdexcept>

#include "tarnstats/StatCatalogue.h"
#include "tarnstats/SysinfoSchema.h"

namespace HostSim {
namespace {

using TarnCtl::Sim::IntKey;
using TarnCtl::Sim::Key;
using TarnCtl::Sim::Path;
using TarnCtl::Sim::StrKey;

LevelKind KindOfAttribute(const StatsRegistry::StatAttributeMetadata& a, bool nextIsDisk, unsigned levels) {
    switch (a.idMapType) {
        case 1: return nextIsDisk ? LevelKind::WorldGroupId : LevelKind::WorldId;
        case 2: return LevelKind::WorldGroupId;
        case 4: return LevelKind::DiskHandle;
        case 5: return LevelKind::VnicPort;
        default: break;
    }
    const std::string name = a.name;
    if (name == "lun device name") return levels == 2 ? LevelKind::VmLun : LevelKind::HostLun;
    if (name == "storage adapter" || name == "adapter") return LevelKind::Adapter;
    if (name == "path") return LevelKind::Path;
    if (name == "pNic hwnic name") return LevelKind::Pnic;
    if (name == "vcpu number") return LevelKind::Vcpu;
    throw std::logic_error("no level kind for attribute \"" + name + "\"");
}

// One concrete instance: the keys of the tree levels and the texts a result carries.
struct Instance {
    Path keys;
    std::vector<std::string> texts;
};

void Enumerate(const Host& host, const std::vector<LevelKind>& kinds, size_t level, const Vm* vm,
               const std::string& moidText, Instance& current, std::vector<Instance>& out) {
    if (level == kinds.size()) {
        out.push_back(current);
        return;
    }
    auto descend = [&](Key key, std::string text, const Vm* context) {
        current.keys.push_back(std::move(key));
        current.texts.push_back(std::move(text));
        Enumerate(host, kinds, level + 1, context, moidText, current, out);
        current.keys.pop_back();
        current.texts.pop_back();
    };
    auto strings = [&](const std::vector<std::string>& names) {
        for (const auto& n : names) descend(StrKey(n), n, vm);
    };
    switch (kinds[level]) {
        case LevelKind::WorldId:
            for (const auto& v : host.vms) descend(IntKey(v.worldId), std::to_string(v.worldId), &v);
            break;
        case LevelKind::WorldGroupId:
            for (const auto& v : host.vms) descend(IntKey(v.worldGroupId), std::to_string(v.worldGroupId), &v);
            break;
        case LevelKind::VmMoid:
            current.texts.push_back(moidText);
            Enumerate(host, kinds, level + 1, vm, moidText, current, out);
            current.texts.pop_back();
            break;
        case LevelKind::VmLun:
            if (vm) strings(vm->luns);
            break;
        case LevelKind::HostLun: strings(host.luns); break;
        case LevelKind::DiskHandle:
            if (vm) {
                for (const auto& d : vm->disks) descend(IntKey(d.handle), d.name, vm);
            }
            break;
        case LevelKind::VnicPort:
            for (const auto& v : host.vms) {
                for (uint64_t port : v.vnicPorts) descend(IntKey(port), std::to_string(port), &v);
            }
            break;
        case LevelKind::Vcpu:
            if (vm) {
                for (unsigned c = 0; c < vm->vcpus; ++c) descend(IntKey(c), std::to_string(c), vm);
            }
            break;
        case LevelKind::Adapter: strings(host.adapters); break;
        case LevelKind::Path: strings(host.paths); break;
        case LevelKind::Pnic: strings(host.pnics); break;
    }
}

std::vector<Instance> Instances(const Host& host, long statId, const std::string& moidText) {
    std::vector<Instance> out;
    Instance current;
    Enumerate(host, StatLevels(statId), 0, nullptr, moidText, current, out);
    return out;
}

// Member stats of the read node of `statId`, in the set's member order.
std::vector<long> Members(long statId) {
    const int32_t setId = statMetadataTab[statId].statSetId;
    if (setId < 0) return {statId};
    std::vector<long> members;
    const auto& set = statSetTab[setId];
    for (uint32_t i = 0; i < set.numStats; ++i) {
        members.push_back(static_cast<long>(statSetStatInfoTab[set.statInfoIds[i]].statId));
    }
    return members;
}

void RequireUnique(std::set<std::string>& seen, const std::string& what, const std::string& value) {
    if (!seen.insert(value).second) throw std::invalid_argument("duplicate " + what + " " + value);
}

void Validate(const Host& host) {
    std::set<std::string> worlds, groups, ports, luns, adapters, paths, pnics, moids;
    for (const auto& vm : host.vms) {
        RequireUnique(worlds, "world id", std::to_string(vm.worldId));
        RequireUnique(groups, "world group id", std::to_string(vm.worldGroupId));
        RequireUnique(moids, "VM", vm.moid);
        std::set<std::string> handles, names, vmLuns;
        for (const auto& d : vm.disks) {
            RequireUnique(handles, "vSCSI handle", std::to_string(d.handle));
            RequireUnique(names, "disk name", d.name);
            if (d.name.size() > 16) throw std::invalid_argument("disk name longer than 16 bytes: " + d.name);
        }
        for (const auto& l : vm.luns) RequireUnique(vmLuns, "VM LUN", l);
        for (uint64_t p : vm.vnicPorts) RequireUnique(ports, "vNIC port id", std::to_string(p));
    }
    for (const auto& l : host.luns) RequireUnique(luns, "LUN", l);
    for (const auto& a : host.adapters) RequireUnique(adapters, "storage adapter", a);
    for (const auto& p : host.paths) RequireUnique(paths, "storage path", p);
    for (const auto& n : host.pnics) RequireUnique(pnics, "pNIC", n);
}

void PutU64(std::vector<uint8_t>& bytes, size_t at, uint64_t v) { std::memcpy(bytes.data() + at, &v, sizeof v); }

}  // namespace

std::vector<LevelKind> StatLevels(long statId) {
    const auto& m = statMetadataTab[statId];
    std::vector<LevelKind> kinds;
    for (uint32_t j = 0; j < m.numAttributes; ++j) {
        const auto& a = statAttributesTab[m.attributeIds[j]];
        const bool nextIsDisk =
            j + 1 < m.numAttributes && statAttributesTab[m.attributeIds[j + 1]].idMapType == 4;
        if (a.idMapType == 5) kinds.push_back(LevelKind::VmMoid);
        kinds.push_back(KindOfAttribute(a, nextIsDisk, m.numAttributes));
    }
    return kinds;
}

std::vector<std::vector<std::string>> StatInstances(const Host& host, long statId, const std::string& moidText) {
    std::vector<std::vector<std::string>> out;
    for (auto& i : Instances(host, statId, moidText)) out.push_back(std::move(i.texts));
    return out;
}

int64_t DefaultValue(long statId, const std::vector<std::string>& instances) {
    uint64_t h = 1469598103934665603ull ^ static_cast<uint64_t>(statId);
    for (const auto& text : instances) {
        for (unsigned char c : text) h = (h ^ c) * 1099511628211ull;
        h = (h ^ 0xff) * 1099511628211ull;
    }
    // A plausible range per unit, so that sample output reads like a real host's.
    struct Range {
        int64_t low, high;
    };
    static const Range byUnit[] = {
        {0, 100},              // percent
        {1048576, 67108864},   // kiloBytes: 1 to 64 GiB
        {1024, 65536},         // megaBytes
        {2000, 48000},         // megaHertz
        {0, 64},               // number
        {50, 20000},           // microsecond
        {0, 40},               // millisecond
        {0, 600},              // second
        {100, 900000},         // kiloBytesPerSecond
        {1, 900},              // megaBytesPerSecond
        {60, 900},             // watt
        {1000, 1000000},       // joule
    };
    const int32_t unit = statMetadataTab[statId].unit;
    const Range r = unit >= 0 && unit < 12 ? byUnit[unit] : Range{0, 1000};
    return r.low + static_cast<int64_t>(h % static_cast<uint64_t>(r.high - r.low + 1));
}

int64_t ValueOf(const Host& host, long statId, const std::vector<std::string>& instances) {
    // A VM moid level is no tree level: the value does not depend on its text.
    std::vector<std::string> key = instances;
    const auto kinds = StatLevels(statId);
    for (size_t i = 0; i < kinds.size() && i < key.size(); ++i) {
        if (kinds[i] == LevelKind::VmMoid) key[i] = "*";
    }
    auto it = host.values.find(ValueKey(statId, key));
    return it != host.values.end() ? it->second : DefaultValue(statId, key);
}

std::shared_ptr<TarnCtl::Sim::Tree> SchemaTree() { return std::make_shared<TarnCtl::Sim::Tree>(SchemaNodes()); }

std::vector<TarnCtl::Sim::NodeInfo> SchemaNodes() {
    std::vector<TarnCtl::Sim::NodeInfo> nodes(kelMaxNodes);
    for (uint32_t i = 0; i < kelMaxNodes; ++i) {
        const auto& n = kelNodesLookupTab[i];
        nodes[i].isLeaf = n.isLeaf != 0;
        nodes[i].isInstance = n.isInstance != 0;
        nodes[i].isIntegerInstance = n.isIntegerInstance != 0;
        nodes[i].parent = n.parent;
        nodes[i].outputSize = n.outputSize;
        nodes[i].name = n.name;
    }
    return nodes;
}

std::shared_ptr<TarnCtl::Sim::Tree> BuildTree(const Host& host) {
    Validate(host);
    auto tree = SchemaTree();
    std::set<uint32_t> done;
    for (long statId = 0; statId < static_cast<long>(statIdMax); ++statId) {
        const uint32_t node = statIdMap[statId];
        if (!done.insert(node).second) continue;
        const std::vector<long> members = Members(statId);
        for (const auto& inst : Instances(host, statId, "*")) {
            // Instance nodes from the read node upward, one per tree level.
            std::vector<uint32_t> chain(inst.keys.size());
            uint32_t at = node;
            for (size_t i = chain.size(); i-- > 0;) {
                chain[i] = at;
                at = static_cast<uint32_t>(kelNodesLookupTab[at].parent);
            }
            for (size_t i = 0; i < chain.size(); ++i) {
                tree->AddInstance(chain[i], Path(inst.keys.begin(), inst.keys.begin() + static_cast<long>(i)),
                                  inst.keys[i]);
            }
            std::vector<uint8_t> record(4 + 16 * members.size(), 0);
            const uint32_t count = static_cast<uint32_t>(members.size());
            std::memcpy(record.data(), &count, sizeof count);
            for (size_t j = 0; j < members.size(); ++j) {
                PutU64(record, 4 + 16 * j, static_cast<uint64_t>(members[j]));
                PutU64(record, 4 + 16 * j + 8, static_cast<uint64_t>(ValueOf(host, members[j], inst.texts)));
            }
            tree->SetRecord(node, inst.keys, std::move(record));
        }
    }
    for (const auto& vm : host.vms) {
        if (vm.disks.empty()) continue;
        tree->AddInstance(492, {}, IntKey(vm.worldGroupId));
        for (const auto& d : vm.disks) {
            tree->AddInstance(1314, {IntKey(vm.worldGroupId)}, IntKey(d.handle));
            std::vector<uint8_t> name(16, 0);
            std::memcpy(name.data(), d.name.data(), d.name.size());
            tree->SetRecord(1315, {IntKey(vm.worldGroupId), IntKey(d.handle)}, std::move(name));
        }
    }
    return tree;
}

}  // namespace HostSim
