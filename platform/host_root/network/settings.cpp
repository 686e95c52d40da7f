// SPDX-License-Identifier: MIT
#include "platform/host_root/network/settings.h"

#include <arpa/inet.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavisdk/bridge.h>

#include <algorithm>
#include <filesystem>
#include <memory>

#include "platform/host_root/network/error.h"

namespace taviwireless::network {

namespace {

constexpr char kFolder[] = "/etc/sysconfig/network-scripts";
constexpr char kFilePrefix[] = "ifcfg-";
constexpr char kModelInfo[] = "/etc.defaults/taviinfo.conf";

std::string FileOf(const std::string& interface) {
    return std::string(kFolder) + '/' + kFilePrefix + interface;
}

bool Says(const std::string& file, const char* key, const char* value) {
    return VEXACFileCheckKeyValue(file.c_str(), key, value, 0) == 1;
}

std::string Value(const std::string& file, const char* key) {
    char value[64];
    return VEXACFileGetKeyValue(file.c_str(), key, value, sizeof value) > 0 ? value : "";
}

bool IsName(const std::string& name) {
    return !name.empty() && name.size() < TAVI_NET_IF_NAME_SIZE && name != "." && name != ".." &&
           name[0] != '-' &&
           name.find_first_not_of(
               "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789"
               "._-:@+") == std::string::npos;
}

// "10.1.14.1/24"
std::string WithLength(const std::string& address, const std::string& netmask,
                       const std::string& file) {
    in_addr local{};
    in_addr mask{};
    if (inet_pton(AF_INET, address.c_str(), &local) != 1 ||
        inet_pton(AF_INET, netmask.c_str(), &mask) != 1) {
        throw Error("IPADDR and NETMASK in " + file + " are not an address and its netmask");
    }
    const uint32_t hostBits = ~ntohl(mask.s_addr);
    if ((hostBits & (hostBits + 1)) != 0) {
        throw Error("NETMASK in " + file + " is not a netmask");
    }
    return address + '/' + std::to_string(__builtin_popcount(~hostBits));
}

Card ReadCard(const std::string& interface) {
    const std::string file = FileOf(interface);
    Card card;
    card.byDhcp = Says(file, "BOOTPROTO", "dhcp");
    const std::string address = Value(file, "IPADDR");
    if (!card.byDhcp && !address.empty()) {
        card.address = WithLength(address, Value(file, "NETMASK"), file);
    }
    return card;
}

std::vector<std::string> NamesWithFiles() {
    VEXACSzList* list = VEXACSzListAlloc(1024);
    if (list == nullptr) {
        throw std::bad_alloc();
    }
    VEXACFileEnumDir(kFolder, kFilePrefix, &list, VEXAC_ENUM_FILES);  // no folder, no names
    const std::unique_ptr<VEXACSzList, decltype(&VEXACSzListFree)> files(list, VEXACSzListFree);
    std::vector<std::string> names;
    for (int i = 0; i < files->count; ++i) {
        names.push_back(std::string(VEXACSzListGet(list, i)).substr(sizeof kFilePrefix - 1));
    }
    return names;
}

// The first member, as the SDK tells it, and all whose file puts them into the bridge.
std::vector<std::string> ReadMembers(const std::string& bridge) {
    std::vector<std::string> members;
    const auto add = [&members](const std::string& name) {
        if (IsName(name) && std::find(members.begin(), members.end(), name) == members.end()) {
            members.push_back(name);
        }
    };
    TAVINetBridge config;
    TAVINetBridgeMember first;
    if (TAVINetGetBridgeConfig(bridge.c_str(), &config, &first) >= 0) {
        add(first.interface);
    }
    for (const std::string& name : NamesWithFiles()) {
        if (Says(FileOf(name), "BRIDGE", bridge.c_str())) {
            add(name);
        }
    }
    return members;
}

// A bridge around the wired interface may have none in its own file; it takes over that one's.
Card CardOfBridge(const BridgeSettings& bridge, const std::string& radio) {
    Card card = ReadCard(bridge.name);
    for (const std::string& member : bridge.members) {
        if (card.IsEmpty() && member != radio) {
            card = ReadCard(member);
        }
    }
    return card;
}

BridgeSettings ReadBridge(const std::string& name, bool isOn, const std::string& radio) {
    BridgeSettings bridge;
    bridge.name = name;
    bridge.isOn = isOn;
    if (isOn) {
        bridge.members = ReadMembers(name);
        bridge.card = CardOfBridge(bridge, radio);
        bridge.servesLeases = Says(DhcpServerInfo(name), "enable", "yes");
    }
    return bridge;
}

void Add(const Enabled& enabled, const std::string& interface, BridgeSettings& bridge) {
    for (const std::string& member : {enabled.member, interface}) {
        if (IsName(member)) {
            bridge.members.push_back(member);
        }
    }
    if (bridge.card.IsEmpty()) {
        bridge.card = enabled.address.empty() ? CardOfBridge(bridge, interface)
                                              : Card{false, enabled.address};
    }
    bridge.servesLeases = bridge.servesLeases || enabled.leases;
}

// The bridge that the interface is in; empty when it is in none.
std::string MasterOf(const std::string& interface) {
    std::error_code none;
    return std::filesystem::read_symlink("/sys/class/net/" + interface + "/master", none)
        .filename();
}

void CheckNames(const std::string& interface, const std::string& bridge) {
    if (!IsName(interface)) {
        throw Error('"' + interface + "\" is not an interface's name");
    }
    if (!bridge.empty() && !IsName(bridge)) {
        throw Error('"' + bridge + "\" is not a bridge's name");
    }
    if (bridge == kGuestBridge) {
        throw Error(bridge + " is the guests' bridge; give the main network another");
    }
}

}  // namespace

Settings ReadSettings(const std::string& interface, const std::string& bridge,
                      const std::optional<Enabled>& enabled) {
    CheckNames(interface, bridge);
    const std::string hostapd = "/etc/hostapd/hostapd-" + interface;
    Settings settings;
    settings.interface = interface;
    settings.accessPoint = enabled || Says(hostapd + ".info", "enable", "yes");
    // A model that has no guests any more keeps the file that says it has some.
    settings.guests = settings.accessPoint && Says(kModelInfo, "support_pci_wifi", "yes") &&
                      (enabled ? enabled->guests : Says(hostapd + "-guest.info", "enable", "yes"));
    const std::string name = bridge.empty() ? MasterOf(interface) : bridge;
    if (!name.empty() && name != kGuestBridge) {
        const bool isOn = enabled || Says(FileOf(name), "ONBOOT", "yes");
        settings.bridges.push_back(ReadBridge(name, isOn, interface));
    }
    settings.bridges.push_back(ReadBridge(kGuestBridge, settings.guests, interface));
    if (enabled) {
        Add(*enabled, interface, settings.bridges.front());
    }
    char gateway[TAVI_NET_ADDRESS_SIZE];
    in_addr address;
    if (TAVINetDefaultGatewayGetConf(gateway, sizeof gateway) == 0 &&
        inet_pton(AF_INET, gateway, &address) == 1) {
        settings.gateway = gateway;
    }
    return settings;
}

Card OwnCard(const std::string& interface) {
    return Says(FileOf(interface), "ONBOOT", "yes") ? ReadCard(interface) : Card();
}

bool HasFile(const std::string& interface) {
    return VEXACFileExist(FileOf(interface).c_str()) == 1;
}

std::string DhcpServerInfo(const std::string& bridge) {
    return "/etc/dhcpd/dhcpd-" + bridge + '-' + bridge + ".info";
}

}  // namespace taviwireless::network
