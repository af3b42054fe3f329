#include "hostsim/HostFile.h"

#include <cerrno>
#include <cstdint>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <initializer_list>
#include <limits>
#include <map>
#include <nlohmann/json.hpp>
#include <set>
#include <sstream>

#include "tarnstats/StatCatalogue.h"
#include "tools/CodeTexts.h"
#include "tools/JsonPositions.h"

namespace HostSim {
namespace {

using Json = nlohmann::json;

constexpr uint64_t kMaxId = static_cast<uint64_t>(std::numeric_limits<int64_t>::max());
constexpr unsigned kMaxVcpus = 256;
constexpr std::size_t kDiskNameBytes = 16;  // the kernel's device name field

std::string Compose(const std::string& source, std::size_t line, std::size_t column, const std::string& pointer,
                    const std::string& message) {
    if (line == 0) return source + ": " + message;
    std::string out = source + ":" + std::to_string(line) + ":" + std::to_string(column) + ": ";
    if (!pointer.empty()) out += pointer + ": ";
    return out + message;
}

std::string Found(const Json& j) {
    switch (j.type()) {
        case Json::value_t::object: return "an object";
        case Json::value_t::array: return "an array";
        case Json::value_t::string: return "the string " + j.dump();
        case Json::value_t::boolean: return j.get<bool>() ? "true" : "false";
        case Json::value_t::null: return "null";
        case Json::value_t::number_integer:
        case Json::value_t::number_unsigned: return "the number " + j.dump();
        case Json::value_t::number_float: return "a number that is not a 64-bit integer";
        default: return "something else";
    }
}

// The objects a value can belong to, with what names its instance levels.
struct Owner {
    const Vm* vm = nullptr;
    std::string name;  // disk device name, LUN, adapter, path or pNIC name
    uint64_t port = 0;
    unsigned vcpu = 0;
};

std::vector<std::string> InstanceTexts(long statId, const Owner& owner) {
    std::vector<std::string> texts;
    for (LevelKind kind : StatLevels(statId)) {
        switch (kind) {
            case LevelKind::WorldId: texts.push_back(std::to_string(owner.vm->worldId)); break;
            case LevelKind::WorldGroupId: texts.push_back(std::to_string(owner.vm->worldGroupId)); break;
            case LevelKind::VmMoid: texts.push_back("*"); break;  // no tree level: not part of the key
            case LevelKind::VnicPort: texts.push_back(std::to_string(owner.port)); break;
            case LevelKind::Vcpu: texts.push_back(std::to_string(owner.vcpu)); break;
            default: texts.push_back(owner.name); break;  // LUNs, disks, adapters, paths, pNICs
        }
    }
    return texts;
}

// Stat ids by object type and name; the pair is unique in the catalogue.
std::map<int32_t, std::map<std::string, long>> StatsByObjectType() {
    std::map<int32_t, std::map<std::string, long>> out;
    for (uint32_t id = 0; id < statIdMax; ++id) {
        out[statMetadataTab[id].objectType][statMetadataTab[id].name] = static_cast<long>(id);
    }
    return out;
}

class Reader {
public:
    Reader(const std::string& text, std::string source) : text_(text), source_(std::move(source)) {}

    Host Read() {
        Parse();
        const Json& root = doc_;
        Object(root, "");
        Members(root, "", {"version", "host", "vms", "luns", "adapters", "paths", "pnics"});
        const Json& version = Need(root, "", "version");
        if (!version.is_number_integer() || version.get<int64_t>() != kHostFileVersion) {
            Fail("/version", "expected " + std::to_string(kHostFileVersion) + ", found " + Found(version));
        }
        NamedList(root, "luns", StatsRegistry::SR_OBJECTTYPE_HOST_LUN, host_.luns, "LUN");
        NamedList(root, "adapters", StatsRegistry::SR_OBJECTTYPE_STORAGEADAPTER, host_.adapters, "storage adapter");
        NamedList(root, "paths", StatsRegistry::SR_OBJECTTYPE_STORAGEPATH, host_.paths, "storage path");
        NamedList(root, "pnics", StatsRegistry::SR_OBJECTTYPE_PHYSICALNIC, host_.pnics, "pNIC");
        if (const Json* h = Find(root, "host")) {
            Object(*h, "/host");
            Members(*h, "/host", {"values"});
            Values(*h, "/host", StatsRegistry::SR_OBJECTTYPE_HOST, Owner{});
        }
        if (const Json* vms = Find(root, "vms")) {
            Array(*vms, "/vms");
            for (std::size_t i = 0; i < vms->size(); ++i) ReadVm((*vms)[i], PointerChild("/vms", i));
        }
        return std::move(host_);
    }

private:
    void Parse() {
        try {
            doc_ = Json::parse(text_);
        } catch (const Json::parse_error& e) {
            const TextPosition at = PositionOf(text_, e.byte > 0 ? e.byte - 1 : 0);
            throw HostFileError(source_, at.line, at.column, "", SyntaxMessage(e.what()));
        }
        try {
            positions_ = IndexJsonPositions(text_);
        } catch (const JsonPositionError& e) {
            throw HostFileError(source_, e.Where().line, e.Where().column, e.Pointer(), e.what());
        }
    }

    // The parser's message without its prefix, its position and the raw bytes it last read.
    static std::string SyntaxMessage(std::string what) {
        const std::string marker = "syntax error while parsing ";
        auto at = what.find(marker);
        if (at != std::string::npos) what = what.substr(at);
        const auto dash = what.find(" - ");
        if (dash != std::string::npos) what.replace(dash, 3, ": ");
        const auto lastRead = what.find("; last read: '");
        if (lastRead != std::string::npos) {
            const auto expected = what.find("'; expected ", lastRead);
            what.erase(lastRead, expected == std::string::npos ? std::string::npos : expected + 1 - lastRead);
        }
        return what;
    }

    [[noreturn]] void Fail(const std::string& pointer, const std::string& message, bool atKey = false) const {
        const JsonPlace place = positions_.At(pointer);
        const TextPosition at = atKey ? place.key : place.value;
        throw HostFileError(source_, at.line, at.column, pointer, message);
    }

    void Object(const Json& j, const std::string& ptr) const {
        if (!j.is_object()) Fail(ptr, "expected an object, found " + Found(j));
    }
    void Array(const Json& j, const std::string& ptr) const {
        if (!j.is_array()) Fail(ptr, "expected an array, found " + Found(j));
    }

    // Every member of `obj` is one of `allowed` or "comment" (a string, ignored).
    void Members(const Json& obj, const std::string& ptr, std::initializer_list<const char*> allowed) const {
        for (const auto& item : obj.items()) {
            const std::string child = PointerChild(ptr, item.key());
            if (item.key() == "comment") {
                if (!item.value().is_string()) Fail(child, "expected a string, found " + Found(item.value()));
                continue;
            }
            bool known = false;
            std::string list;
            for (const char* name : allowed) {
                known = known || item.key() == name;
                list += std::string(list.empty() ? "" : ", ") + name;
            }
            if (!known) Fail(child, "unknown member \"" + item.key() + "\"; expected one of: " + list + ", comment", true);
        }
    }

    static const Json* Find(const Json& obj, const char* name) {
        auto it = obj.find(name);
        return it == obj.end() ? nullptr : &*it;
    }
    const Json& Need(const Json& obj, const std::string& ptr, const char* name) const {
        const Json* j = Find(obj, name);
        if (j == nullptr) Fail(ptr, std::string("missing member \"") + name + "\"");
        return *j;
    }

    uint64_t Id(const Json& j, const std::string& ptr) const {
        if (!j.is_number_unsigned() || j.get<uint64_t>() > kMaxId) {
            Fail(ptr, "expected an integer from 0 to " + std::to_string(kMaxId) + ", found " + Found(j));
        }
        return j.get<uint64_t>();
    }

    std::string Name(const Json& j, const std::string& ptr, std::size_t maxBytes = 0) const {
        if (!j.is_string()) Fail(ptr, "expected a name (a string), found " + Found(j));
        const std::string name = j.get<std::string>();
        if (name.empty()) Fail(ptr, "expected a name, found an empty string");
        if (name == "*") Fail(ptr, "expected a name, found \"*\", which stands for every instance");
        for (unsigned char c : name) {
            if (c < 0x20 || c == 0x7f) Fail(ptr, "expected a name without control characters, found " + Found(j));
        }
        if (maxBytes != 0 && name.size() > maxBytes) {
            Fail(ptr, "expected a name of at most " + std::to_string(maxBytes) + " bytes, found " +
                          std::to_string(name.size()) + " bytes");
        }
        return name;
    }

    // Records `key` in `seen`; a second use of it fails at `ptr`.
    void Unique(std::map<std::string, std::string>& seen, const std::string& key, const std::string& ptr,
                const std::string& what) const {
        auto [it, fresh] = seen.emplace(key, ptr);
        if (!fresh) Fail(ptr, what + " " + key + " is already used at " + it->second);
    }

    // The "values" member of `obj`: stat name -> 64-bit integer, for stats of `objectType`.
    void Values(const Json& obj, const std::string& ptr, int32_t objectType, const Owner& owner) {
        const Json* values = Find(obj, "values");
        if (values == nullptr) return;
        const std::string vptr = ptr + "/values";
        Object(*values, vptr);
        const auto& stats = statsByType_[objectType];
        for (const auto& item : values->items()) {
            const std::string child = PointerChild(vptr, item.key());
            auto stat = stats.find(item.key());
            if (stat == stats.end()) {
                std::string names;
                for (const auto& s : stats) names += (names.empty() ? "" : ", ") + s.first;
                Fail(child, "no stat of object type " + Tool::ObjectTypeText(objectType) + " is named \"" + item.key() +
                                "\"; expected one of: " + names,
                     true);
            }
            const Json& v = item.value();
            const bool fits = v.is_number_integer() && (!v.is_number_unsigned() || v.get<uint64_t>() <= kMaxId);
            if (!fits) {
                Fail(child, "expected an integer from " + std::to_string(std::numeric_limits<int64_t>::min()) + " to " +
                                std::to_string(std::numeric_limits<int64_t>::max()) + ", found " + Found(v));
            }
            host_.values[ValueKey(stat->second, InstanceTexts(stat->second, owner))] = v.get<int64_t>();
        }
    }

    // A list of named objects: each a name, or {"name": ..., "values": {...}}.
    std::vector<std::pair<std::string, std::string>> Named(const Json& list, const std::string& ptr, const char* what,
                                                           std::map<std::string, std::string>& seen) const {
        Array(list, ptr);
        std::vector<std::pair<std::string, std::string>> out;  // name, pointer of the element
        for (std::size_t i = 0; i < list.size(); ++i) {
            const std::string eptr = PointerChild(ptr, i);
            const Json& e = list[i];
            std::string name;
            if (e.is_object()) {
                Members(e, eptr, {"name", "values"});
                name = Name(Need(e, eptr, "name"), eptr + "/name");
                Unique(seen, "\"" + name + "\"", eptr + "/name", what);
            } else if (e.is_string()) {
                name = Name(e, eptr);
                Unique(seen, "\"" + name + "\"", eptr, what);
            } else {
                Fail(eptr, std::string("expected a ") + what + " name or an object with \"name\", found " + Found(e));
            }
            out.emplace_back(name, eptr);
        }
        return out;
    }

    void NamedList(const Json& root, const char* member, int32_t objectType, std::vector<std::string>& names,
                   const char* what) {
        const Json* list = Find(root, member);
        if (list == nullptr) return;
        std::map<std::string, std::string> seen;
        const std::string ptr = std::string("/") + member;
        for (const auto& [name, eptr] : Named(*list, ptr, what, seen)) {
            names.push_back(name);
            Owner owner;
            owner.name = name;
            const Json& e = doc_.at(Json::json_pointer(eptr));
            if (e.is_object()) Values(e, eptr, objectType, owner);
            if (objectType == StatsRegistry::SR_OBJECTTYPE_HOST_LUN) hostLuns_.insert(name);
        }
    }

    void ReadVcpus(const Json& vmJson, const std::string& ptr, Vm& vm) {
        const Json* vcpus = Find(vmJson, "vcpus");
        if (vcpus == nullptr) return;  // one vCPU
        const std::string cptr = ptr + "/vcpus";
        const std::string expected =
            "expected a vCPU count from 1 to " + std::to_string(kMaxVcpus) + " or an array of 1 to " +
            std::to_string(kMaxVcpus) + " vCPU objects, found ";
        if (vcpus->is_number_unsigned() && vcpus->get<uint64_t>() >= 1 && vcpus->get<uint64_t>() <= kMaxVcpus) {
            vm.vcpus = static_cast<unsigned>(vcpus->get<uint64_t>());
            return;
        }
        if (!vcpus->is_array() || vcpus->empty() || vcpus->size() > kMaxVcpus) Fail(cptr, expected + Found(*vcpus));
        vm.vcpus = static_cast<unsigned>(vcpus->size());
        for (std::size_t c = 0; c < vcpus->size(); ++c) {
            const std::string eptr = PointerChild(cptr, c);
            Object((*vcpus)[c], eptr);
            Members((*vcpus)[c], eptr, {"values"});
            Owner owner;
            owner.vm = &vm;
            owner.vcpu = static_cast<unsigned>(c);
            Values((*vcpus)[c], eptr, StatsRegistry::SR_OBJECTTYPE_VIRTUALCPU, owner);
        }
    }

    void ReadVnics(const Json& vmJson, const std::string& ptr, Vm& vm) {
        const Json* vnics = Find(vmJson, "vnics");
        if (vnics == nullptr) return;
        const std::string nptr = ptr + "/vnics";
        Array(*vnics, nptr);
        for (std::size_t n = 0; n < vnics->size(); ++n) {
            const std::string eptr = PointerChild(nptr, n);
            const Json& e = (*vnics)[n];
            Owner owner;
            owner.vm = &vm;
            if (e.is_object()) {
                Members(e, eptr, {"port", "values"});
                owner.port = Id(Need(e, eptr, "port"), eptr + "/port");
                Unique(ports_, std::to_string(owner.port), eptr + "/port", "vNIC port id");
                Values(e, eptr, StatsRegistry::SR_OBJECTTYPE_VIRTUALNIC, owner);
            } else if (e.is_number_unsigned()) {
                owner.port = Id(e, eptr);
                Unique(ports_, std::to_string(owner.port), eptr, "vNIC port id");
            } else {
                Fail(eptr, "expected a vNIC port id or an object with \"port\", found " + Found(e));
            }
            vm.vnicPorts.push_back(owner.port);
        }
    }

    void ReadDisks(const Json& vmJson, const std::string& ptr, Vm& vm) {
        const Json* disks = Find(vmJson, "disks");
        if (disks == nullptr) return;
        const std::string dptr = ptr + "/disks";
        Array(*disks, dptr);
        std::map<std::string, std::string> handles, names;
        for (std::size_t d = 0; d < disks->size(); ++d) {
            const std::string eptr = PointerChild(dptr, d);
            const Json& e = (*disks)[d];
            Object(e, eptr);
            Members(e, eptr, {"handle", "name", "values"});
            Disk disk;
            disk.handle = Id(Need(e, eptr, "handle"), eptr + "/handle");
            Unique(handles, std::to_string(disk.handle), eptr + "/handle", "vSCSI handle");
            disk.name = Name(Need(e, eptr, "name"), eptr + "/name", kDiskNameBytes);
            Unique(names, "\"" + disk.name + "\"", eptr + "/name", "disk name");
            Owner owner;
            owner.vm = &vm;
            owner.name = disk.name;
            Values(e, eptr, StatsRegistry::SR_OBJECTTYPE_VIRTUALDISK, owner);
            vm.disks.push_back(disk);
        }
    }

    void ReadVmLuns(const Json& vmJson, const std::string& ptr, Vm& vm) {
        const Json* luns = Find(vmJson, "luns");
        if (luns == nullptr) return;
        std::map<std::string, std::string> seen;
        for (const auto& [name, eptr] : Named(*luns, ptr + "/luns", "LUN", seen)) {
            if (hostLuns_.count(name) == 0) {
                Fail(eptr, "expected the name of a LUN listed under /luns, found \"" + name + "\"");
            }
            vm.luns.push_back(name);
            Owner owner;
            owner.vm = &vm;
            owner.name = name;
            const Json& e = doc_.at(Json::json_pointer(eptr));
            if (e.is_object()) Values(e, eptr, StatsRegistry::SR_OBJECTTYPE_VM_LUN, owner);
        }
    }

    void ReadVm(const Json& j, const std::string& ptr) {
        Object(j, ptr);
        Members(j, ptr, {"moid", "worldId", "worldGroupId", "vcpus", "vnics", "disks", "luns", "values"});
        Vm vm;
        vm.moid = Name(Need(j, ptr, "moid"), ptr + "/moid");
        Unique(moids_, "\"" + vm.moid + "\"", ptr + "/moid", "VM moid");
        vm.worldId = Id(Need(j, ptr, "worldId"), ptr + "/worldId");
        Unique(worlds_, std::to_string(vm.worldId), ptr + "/worldId", "world id");
        vm.worldGroupId = Id(Need(j, ptr, "worldGroupId"), ptr + "/worldGroupId");
        Unique(groups_, std::to_string(vm.worldGroupId), ptr + "/worldGroupId", "world group id");
        ReadVcpus(j, ptr, vm);
        ReadVnics(j, ptr, vm);
        ReadDisks(j, ptr, vm);
        ReadVmLuns(j, ptr, vm);
        Owner owner;
        owner.vm = &vm;
        Values(j, ptr, StatsRegistry::SR_OBJECTTYPE_VIRTUALMACHINE, owner);
        host_.vms.push_back(std::move(vm));
    }

    const std::string& text_;
    const std::string source_;
    Json doc_;
    JsonPositions positions_;
    std::map<int32_t, std::map<std::string, long>> statsByType_ = StatsByObjectType();
    std::set<std::string> hostLuns_;
    std::map<std::string, std::string> moids_, worlds_, groups_, ports_;
    Host host_;
};

}  // namespace

HostFileError::HostFileError(std::string source, std::size_t line, std::size_t column, std::string pointer,
                             std::string message)
    : std::runtime_error(Compose(source, line, column, pointer, message)),
      source_(std::move(source)),
      line_(line),
      column_(column),
      pointer_(std::move(pointer)),
      message_(std::move(message)) {}

Host ParseHostText(const std::string& text, const std::string& source) { return Reader(text, source).Read(); }

Host LoadHostFile(const std::string& path) {
    std::error_code ec;
    if (std::filesystem::is_directory(path, ec)) throw HostFileError(path, 0, 0, "", "cannot read the file: it is a directory");
    std::ifstream in(path, std::ios::binary);
    if (!in) throw HostFileError(path, 0, 0, "", std::string("cannot open the file: ") + std::strerror(errno));
    std::ostringstream text;
    text << in.rdbuf();
    if (in.bad()) throw HostFileError(path, 0, 0, "", "cannot read the file");
    return ParseHostText(text.str(), path);
}

}  // namespace HostSim
