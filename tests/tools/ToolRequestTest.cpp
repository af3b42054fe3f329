// What a user types for `get`: stats by id, name@objectType or unique name; instance lists; and
// the per-VM requests the tool makes for a VM moid level.
#include <gtest/gtest.h>

#include <cctype>
#include <map>

#include "hostsim/Host.h"
#include "tarnstats/KELStats.h"
#include "tools/Catalogue.h"
#include "tools/Requests.h"
#include "tools/ToolError.h"

namespace {

class ToolRequests : public ::testing::Test {
protected:
    static Tool::Catalogue Make() {
        Plinth::Ref<StatsRegistry::KELStats> stats;
        StatsRegistry::KELStatsFactory::GetKELStats(stats);
        Plinth::RefVector<StatsRegistry::StatDef> defs;
        stats->GetStatsList(defs);
        return Tool::Catalogue(std::move(defs));
    }
    std::string Refusal(const std::vector<std::string>& words) const {
        try {
            Tool::ParseRequest(catalogue, words);
        } catch (const Tool::UsageError& e) {
            return e.what();
        }
        return "accepted";
    }
    std::vector<std::vector<std::string>> Asked(long stat, std::vector<std::string> instances) const {
        std::vector<std::vector<std::string>> out;
        for (const auto& r : Tool::LibraryRequests(catalogue, host, Tool::Request{stat, std::move(instances)})) {
            EXPECT_EQ(r.statId, stat);
            out.push_back(r.instances);
        }
        return out;
    }

    const Tool::Catalogue catalogue = Make();
    const HostSim::Host host = HostSim::SampleHost();
};

TEST_F(ToolRequests, EveryStatResolvesByIdAndByNameAtObjectType) {
    for (long id = 0; id < static_cast<long>(catalogue.Size()); ++id) {
        EXPECT_EQ(catalogue.Resolve(std::to_string(id)), id);
        EXPECT_EQ(catalogue.Resolve(catalogue.QualifiedName(id)), id);
        std::string lower = catalogue.Def(id).name + "@" + catalogue.ObjectTypeName(id);
        for (std::size_t i = catalogue.Def(id).name.size(); i < lower.size(); ++i) {
            lower[i] = static_cast<char>(std::tolower(static_cast<unsigned char>(lower[i])));
        }
        EXPECT_EQ(catalogue.Resolve(lower), id) << "object types compare without regard to case";
    }
}

TEST_F(ToolRequests, NamesAloneResolveOnlyWhenUnique) {
    std::map<std::string, std::vector<long>> byName;
    for (long id = 0; id < static_cast<long>(catalogue.Size()); ++id) byName[catalogue.Def(id).name].push_back(id);
    EXPECT_EQ(byName.size(), 49u);
    for (const auto& [name, ids] : byName) {
        if (ids.size() == 1) {
            EXPECT_EQ(catalogue.Resolve(name), ids[0]);
            continue;
        }
        try {
            catalogue.Resolve(name);
            ADD_FAILURE() << name << " resolved";
        } catch (const Tool::UsageError& e) {
            const std::string message = e.what();
            EXPECT_EQ(message.rfind("ambiguous stat name \"" + name + "\": use one of ", 0), 0u) << message;
            for (long id : ids) {
                EXPECT_NE(message.find(catalogue.QualifiedName(id) + " (" + std::to_string(id) + ")"), std::string::npos)
                    << message;
            }
        }
    }
}

TEST_F(ToolRequests, UnknownStatsAreRefusedWithTheReason) {
    EXPECT_EQ(Refusal({"70"}), "unknown stat id 70: stat ids run from 0 to 69");
    EXPECT_EQ(Refusal({"123456789012"}), "unknown stat id 123456789012: stat ids run from 0 to 69");
    EXPECT_EQ(Refusal({"foo"}), "unknown stat \"foo\" (tarnstats list shows every stat)");
    EXPECT_EQ(Refusal({"foo@VM"}), "unknown stat \"foo\" (tarnstats list shows every stat)");
    EXPECT_EQ(Refusal({"mem.consumed.vms@VM"}),
              "no stat \"mem.consumed.vms@VM\": the name \"mem.consumed.vms\" belongs to mem.consumed.vms@host (60)");
    EXPECT_EQ(Refusal({"mem.consumed.vms@"}).rfind("unknown object type \"\" in \"mem.consumed.vms@\": expected one of VM, vCpu", 0),
              0u);
    EXPECT_EQ(Refusal({"-1"}), "unknown stat \"-1\" (tarnstats list shows every stat)");
}

TEST_F(ToolRequests, InstancesAreCheckedPerAttributeLevel) {
    const auto all = Tool::ParseRequest(catalogue, {"virtualDisk.throughput.usage@vDisk"});
    EXPECT_EQ(all.statId, 7);
    EXPECT_EQ(all.instances, (std::vector<std::string>{"*", "*"})) << "no instance means every instance";
    EXPECT_EQ(Tool::ParseRequest(catalogue, {"7", "2001", "web01-disk0"}).instances,
              (std::vector<std::string>{"2001", "web01-disk0"}))
        << "a virtual disk level takes the device name";
    EXPECT_EQ(Tool::ParseRequest(catalogue, {"3"}).instances.size(), 0u);

    EXPECT_EQ(Refusal({"7", "2001"}),
              "stat 7 (virtualDisk.throughput.usage@vDisk) takes 2 instances (world id, vscsi handle) or none, got 1");
    EXPECT_EQ(Refusal({"33", "a", "b", "c"}),
              "stat 33 (net.throughput.usage@vNic) takes 2 instances (vm, vNic PortID) or none, got 3");
    EXPECT_EQ(Refusal({"11", "a", "b"}),
              "stat 11 (storageAdapter.outstandingIOs@storageAdapter) takes 1 instance (storage adapter) or none, got 2");
    EXPECT_EQ(Refusal({"3", "x"}), "stat 3 (disk.throughput.usage@host) takes no instance, got 1");
    for (const char* bad : {"abc", "-1", "+1", "1.5", "9223372036854775808", " 1"}) {
        EXPECT_EQ(Refusal({"5", bad}), std::string("instance \"") + bad +
                                            "\" of attribute \"worldId\" of disk.throughput.usage@VM: expected a decimal "
                                            "number up to 9223372036854775807 or \"*\"");
    }
    EXPECT_EQ(Tool::ParseRequest(catalogue, {"5", "9223372036854775807"}).instances[0], "9223372036854775807");
    EXPECT_EQ(Refusal({"11", ""}),
              "empty instance for attribute \"storage adapter\" of storageAdapter.outstandingIOs@storageAdapter: expected a "
              "text or \"*\"");
    EXPECT_EQ(Tool::RequestText(catalogue, all), "virtualDisk.throughput.usage@vDisk * *");
}

TEST_F(ToolRequests, VmMoidLevelsAreAskedPerVm) {
    // Every VM with each of its ports, in host order.
    std::vector<std::vector<std::string>> every;
    for (const auto& vm : host.vms) {
        for (uint64_t p : vm.vnicPorts) every.push_back({vm.moid, std::to_string(p)});
    }
    ASSERT_GT(every.size(), host.vms.size()) << "the sample host has VMs with two vNICs";
    EXPECT_EQ(Asked(33, {"*", "*"}), every);

    const auto& vm = host.vms[2];
    std::vector<std::vector<std::string>> mine;
    for (uint64_t p : vm.vnicPorts) mine.push_back({vm.moid, std::to_string(p)});
    EXPECT_EQ(Asked(34, {vm.moid, "*"}), mine);
    const std::string port = std::to_string(vm.vnicPorts.back());
    EXPECT_EQ(Asked(33, {"*", port}), (std::vector<std::vector<std::string>>{{vm.moid, port}}));

    // What the host does not know, and fully named requests, go to the library unchanged.
    EXPECT_EQ(Asked(33, {"moid-none", "*"}), (std::vector<std::vector<std::string>>{{"moid-none", "*"}}));
    EXPECT_EQ(Asked(33, {"*", "12345"}), (std::vector<std::vector<std::string>>{{"*", "12345"}}));
    EXPECT_EQ(Asked(33, {host.vms[0].moid, port}), (std::vector<std::vector<std::string>>{{host.vms[0].moid, port}}));
    // Other stats are never expanded.
    EXPECT_EQ(Asked(7, {"*", "*"}), (std::vector<std::vector<std::string>>{{"*", "*"}}));

    // A VM the host knows without any vNIC: nothing to ask.
    HostSim::Host lonely = host;
    lonely.vms[0].vnicPorts.clear();
    EXPECT_TRUE(Tool::LibraryRequests(catalogue, lonely, Tool::Request{33, {lonely.vms[0].moid, "*"}}).empty());
}

}  // namespace
