#include <string>

#include "hostsim/Host.h"

namespace HostSim {

Host SampleHost() {
    struct Shape {
        const char* name;
        unsigned vcpus, disks, vnics;
    } shapes[] = {{"web01", 2, 1, 1}, {"web02", 2, 1, 2}, {"db01", 4, 3, 2},
                  {"cache01", 1, 1, 1}, {"build01", 4, 2, 1}, {"mail01", 3, 2, 2}};
    Host host;
    for (unsigned i = 0; i < 6; ++i) host.luns.push_back("lun.6001405a" + std::to_string(100 + i));
    for (unsigned i = 0; i < 3; ++i) host.adapters.push_back("hba" + std::to_string(i));
    for (unsigned a = 1; a < 3; ++a) {
        for (unsigned t = 0; t < 2; ++t) host.paths.push_back("hba" + std::to_string(a) + ":C0:T" + std::to_string(t) + ":L0");
    }
    for (unsigned i = 0; i < 4; ++i) host.pnics.push_back("nic" + std::to_string(i));

    uint64_t port = 50331649;  // vNIC port ids are allocated per virtual switch
    for (unsigned i = 0; i < 6; ++i) {
        const Shape& s = shapes[i];
        Vm vm;
        vm.moid = "moid-" + std::to_string(101 + i);
        vm.worldId = 1001 + 17 * i;
        vm.worldGroupId = 2001 + 17 * i;
        vm.vcpus = s.vcpus;
        for (unsigned n = 0; n < s.vnics; ++n) vm.vnicPorts.push_back(port++);
        for (unsigned d = 0; d < s.disks; ++d) {
            vm.disks.push_back(Disk{8193 + 2 * d + 64 * i, std::string(s.name) + "-disk" + std::to_string(d)});
        }
        vm.luns.push_back(host.luns[i % host.luns.size()]);
        if (s.disks > 1) vm.luns.push_back(host.luns[(i + 1) % host.luns.size()]);
        host.vms.push_back(vm);
    }
    return host;
}

Host ScaleHost(const ScaleShape& shape) {
    Host host;
    for (unsigned i = 0; i < shape.luns; ++i) host.luns.push_back("lun." + std::to_string(600000 + i));
    for (unsigned i = 0; i < shape.adapters; ++i) host.adapters.push_back("hba" + std::to_string(i));
    for (unsigned i = 0; i < shape.paths; ++i) {
        host.paths.push_back("hba" + std::to_string(i % (shape.adapters ? shape.adapters : 1)) + ":C0:T" +
                             std::to_string(i) + ":L0");
    }
    for (unsigned i = 0; i < shape.pnics; ++i) host.pnics.push_back("nic" + std::to_string(i));
    uint64_t port = 50331649;
    for (unsigned i = 0; i < shape.vms; ++i) {
        Vm vm;
        vm.moid = "moid-" + std::to_string(1000 + i);
        vm.worldId = 100000 + i;
        vm.worldGroupId = 200000 + i;
        vm.vcpus = shape.vcpusPerVm;
        for (unsigned n = 0; n < shape.vnicsPerVm; ++n) vm.vnicPorts.push_back(port++);
        for (unsigned d = 0; d < shape.disksPerVm; ++d) {
            vm.disks.push_back(Disk{8192 + d, "vm" + std::to_string(i) + "-disk" + std::to_string(d)});
        }
        if (!host.luns.empty()) vm.luns.push_back(host.luns[i % host.luns.size()]);
        host.vms.push_back(vm);
    }
    return host;
}

}  // namespace HostSim
