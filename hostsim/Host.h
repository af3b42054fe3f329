// Simulated hosts: a host as a user thinks of it, and the in-memory sysinfo tree it stands for.
//
// A Host lists VMs (world id, world group id, managed object id, vCPUs, vNIC port ids, virtual
// disks with vSCSI handle and device name, the LUNs the VM uses), host LUNs, storage adapters,
// storage paths and physical NICs, plus explicit stat values. BuildTree turns it into a tree over
// the schema's nodes: instances at each stat's instance nodes, one stat set record per concrete
// instance path at each read node, and the vSCSI rows (worldGroups -> vscsi -> name).
//
// Keys by level (from the catalogue's attribute definitions): world ids name VMs, except on the
// virtual disk sets and "VM group ID", which are keyed by the world group id (the kernel keys a
// VM's vSCSI devices by world group); disk levels are keyed by handle; vNIC port ids are listed
// across all VMs; the VM moid level of the vNIC stats is not a tree level.
//
// Values: an explicit value for (stat id, instance texts) when the host has one, else a
// deterministic default in a plausible range for the stat's unit (DefaultValue); the text of a VM moid level is read as "*" for both.
// Instance texts are those a result carries: decimal
// numbers, names, and device names in place of handles.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "TarnCtl/SimTree.h"

namespace HostSim {

struct Disk {
    uint64_t handle = 0;
    std::string name;  // device name; the kernel keeps at most 16 bytes
};

struct Vm {
    std::string moid;  // managed object id, e.g. "vm-101"
    uint64_t worldId = 0;
    uint64_t worldGroupId = 0;
    unsigned vcpus = 1;
    std::vector<uint64_t> vnicPorts;
    std::vector<Disk> disks;
    std::vector<std::string> luns;  // LUN device names the VM uses
};

using ValueKey = std::pair<long, std::vector<std::string>>;

struct Host {
    std::vector<Vm> vms;
    std::vector<std::string> luns;  // host LUN device names
    std::vector<std::string> adapters;
    std::vector<std::string> paths;
    std::vector<std::string> pnics;
    std::map<ValueKey, int64_t> values;
};

// What names the instances of one attribute level.
enum class LevelKind { WorldId, WorldGroupId, VmMoid, VmLun, HostLun, DiskHandle, VnicPort, Vcpu, Adapter, Path, Pnic };

// The level kinds of a stat, level 0 first (VM moid levels included). REQUIRES statId < 70.
std::vector<LevelKind> StatLevels(long statId);

// Every concrete instance of a stat on the host, as result instance texts, in the order a
// wildcard listing at every level yields them. The VM moid level of a vNIC stat holds `moidText`.
std::vector<std::vector<std::string>> StatInstances(const Host& host, long statId, const std::string& moidText = "*");

int64_t DefaultValue(long statId, const std::vector<std::string>& instances);
int64_t ValueOf(const Host& host, long statId, const std::vector<std::string>& instances);

// The schema's nodes as the tree needs them.
std::vector<TarnCtl::Sim::NodeInfo> SchemaNodes();
// A tree holding the schema's nodes and nothing else.
std::shared_ptr<TarnCtl::Sim::Tree> SchemaTree();
// The host's tree. THROWS std::invalid_argument when the host repeats an object at one level or
// gives a device name longer than 16 bytes.
std::shared_ptr<TarnCtl::Sim::Tree> BuildTree(const Host& host);

// A small realistic host: 6 VMs with 1 to 4 vCPUs, 1 to 3 disks and 1 to 2 vNICs each, LUNs,
// adapters, paths and pNICs.
Host SampleHost();
// A generated host of the given size (all VMs alike in shape).
struct ScaleShape {
    unsigned vms = 64, vcpusPerVm = 2, disksPerVm = 4, vnicsPerVm = 2;
    unsigned luns = 256, adapters = 16, paths = 512, pnics = 16;
};
Host ScaleHost(const ScaleShape& shape);

}  // namespace HostSim
