// SPDX-License-Identifier: MIT
// Bridges, as the files of the network script describe them and as the kernel has them.
#include <net/if.h>
#include <tavicore/file.h>
#include <tavisdk/bridge.h>

#include <cstring>

#include "core/failure.h"
#include "core/line.h"
#include "core/text_file.h"
#include "sdk/interface_name.h"
#include "sdk/netlink.h"
#include "sdk/settings_files.h"

using namespace tavicore;
using namespace tavisdk;

namespace {

constexpr char kInterfaceFiles[] = "/etc/sysconfig/network-scripts";
constexpr char kFilePrefix[] = "ifcfg-";

std::string FileOf(const char* interface) {
    return std::string(kInterfaceFiles) + '/' + kFilePrefix + interface;
}

void Append(VEXACSzList** list, const char* text) {
    if (VEXACSzListPush(list, text) < 0) {
        throw Failure{VEXAC_ERR_OUT_OF_MEMORY};
    }
}

// The members that the kernel's bridge has now.
int AppendRealMembers(const char* bridge, VEXACSzList** list) {
    const int index = FindInterface(bridge);
    const Socket socket = OpenRouteSocket();
    nl_cache* all = nullptr;
    Require(rtnl_link_alloc_cache(socket.get(), AF_UNSPEC, &all));
    const Cache cache(all);
    int count = 0;
    for (nl_object* object = nl_cache_get_first(all); object != nullptr;
         object = nl_cache_get_next(object)) {
        auto* link = reinterpret_cast<rtnl_link*>(object);
        if (rtnl_link_get_master(link) == index) {
            Append(list, rtnl_link_get_name(link));
            ++count;
        }
    }
    return count;
}

// The interfaces that the files put into the bridge.
int AppendSavedMembers(const char* bridge, VEXACSzList** list) {
    if (VEXACFileCheckDir(kInterfaceFiles) == 0) {
        throw Failure{VEXACErrGet()};
    }
    const StringList files = ListFiles(kInterfaceFiles, kFilePrefix);
    int count = 0;
    for (int i = 0; i < files->count; ++i) {
        const char* interface = VEXACSzListGet(files.get(), i) + strlen(kFilePrefix);
        if (IsInterfaceName(interface) && HasSetting(FileOf(interface), "BRIDGE", bridge)) {
            Append(list, interface);
            ++count;
        }
    }
    return count;
}

// PRIMARY names the first member; a file by somebody else may lack it.
std::string FirstMember(const char* bridge) {
    char primary[TAVI_NET_IF_NAME_SIZE];
    if (ReadSetting(FileOf(bridge), "PRIMARY", primary, sizeof primary)) {
        return primary;
    }
    StringList members = NewList();
    VEXACSzList* list = members.release();
    const int result = VEXANetBridgeSlaveEnum(bridge, &list);
    members.reset(list);
    if (result < 0) {
        throw Failure{VEXACErrGet()};
    }
    return members->count > 0 ? VEXACSzListGet(members.get(), 0) : "";
}

bool IsWireless(const std::string& interface) {
    return interface.compare(0, strlen("wlan"), "wlan") == 0;
}

// What the file says, or where it is silent, what the first member is.
bool IsLocal(const std::string& file, const std::string& firstMember) {
    char local[8];
    return ReadSetting(file, "LOCAL_LAN", local, sizeof local) ? strcmp(local, "yes") == 0
                                                               : IsWireless(firstMember);
}

std::string Rendered(const TAVINetBridge& config, const TAVINetBridgeMember& member) {
    const PairFormat format("%s=%s\n");
    std::string text = format.Line("DEVICE", config.name) + format.Line("TYPE", "Bridge") +
                       format.Line("ONBOOT", "yes") + format.Line("PRIMARY", member.interface) +
                       format.Line("LOCAL_LAN", config.isLocal != 0 ? "yes" : "no");
    if (config.address[0] != '\0') {  // else its address is that of the first member's file
        text += format.Line("BOOTPROTO", "static") + format.Line("IPADDR", config.address) +
                format.Line("NETMASK", config.netmask);
    }
    return text;
}

void Check(const TAVINetBridge& config, const TAVINetBridgeMember& member) {
    const bool hasAddress = config.address[0] != '\0';
    if (!IsInterfaceName(config.name) || !IsInterfaceName(member.interface) ||
        (config.isLocal != 0) != (member.kind == TAVI_NET_MEMBER_WIRELESS) ||
        (config.isLocal != 0 && !hasAddress)) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
    if (hasAddress) {
        ParseAddress(config.address);
        ParseAddress(config.netmask);
    }
}

}  // namespace

int TAVINetGetBridgeConfig(const char* bridge, TAVINetBridge* config, TAVINetBridgeMember* member) {
    return Guarded(-1, [&] {
        RequireAll(bridge, config, member);
        *config = TAVINetBridge{};
        *member = TAVINetBridgeMember{};
        RequireInterfaceName(bridge);
        const std::string file = FileOf(bridge);
        if (VEXACFileExist(file.c_str()) == 0) {
            throw Failure{VEXACErrGet()};
        }
        CopyOut(bridge, config->name, sizeof config->name);
        CopyOut(FirstMember(bridge), member->interface, sizeof member->interface);
        config->isLocal = IsLocal(file, member->interface) ? 1 : 0;
        member->kind = config->isLocal != 0 ? TAVI_NET_MEMBER_WIRELESS : TAVI_NET_MEMBER_WIRED;
        ReadSetting(file, "IPADDR", config->address, sizeof config->address);
        ReadSetting(file, "NETMASK", config->netmask, sizeof config->netmask);
        if (config->address[0] == '\0' && (config->isLocal != 0 || member->interface[0] == '\0')) {
            // What is left of a bridge that was taken down, such as ONBOOT alone, describes none.
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        return 0;
    });
}

int TAVINetSetBridgeConfig(const TAVINetBridge* config, const TAVINetBridgeMember* member) {
    return Guarded(-1, [&] {
        RequireAll(config, member);
        Check(*config, *member);
        MakeFolder("/etc/sysconfig");
        MakeFolder(kInterfaceFiles);
        ReplaceFile(FileOf(config->name).c_str(), Rendered(*config, *member));
        return 0;
    });
}

int VEXANetBridgeSlaveEnum(const char* bridge, VEXACSzList** list) {
    return Guarded(-1, [&] {
        RequireAll(bridge, list);
        RequireInterfaceName(bridge);
        return if_nametoindex(bridge) != 0 ? AppendRealMembers(bridge, list)
                                           : AppendSavedMembers(bridge, list);
    });
}
