// SPDX-License-Identifier: MIT
// Switching the access point on.
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavicore/process.h>
#include <taviwireless/wireless.h>

#include <cstdio>
#include <optional>
#include <utility>

#include "base/fixed_field.h"
#include "base/sleep_out.h"
#include "common/log.h"
#include "wireless/rules/bridge_names.h"
#include "wireless/rules/dhcp.h"
#include "wireless/rules/paths.h"
#include "wireless/system/bridge.h"
#include "wireless/system/flag_file.h"
#include "wireless/system/guarded.h"
#include "wireless/system/shell.h"

namespace taviwireless::wireless {

namespace {

constexpr int kChannelTries = 5;   // a second each
constexpr int kLeaseTime = 86400;  // seconds

bool SetQuoted(const std::string& file, const char* key, const char* value) {
    if (VEXACFileSetKeyValue(file.c_str(), key, value, kQuotedLine) <= 0) {
        TAVI_LOG_ERROR("Failed to set key[%s] in [%s].", key, file.c_str());
        return false;
    }
    return true;
}

// Returns the stored settings; nothing when they cannot be read, or say that the access point is
// off.
std::optional<WirelessAPConf> ReadSettings(const char* interface) {
    char section[1024];
    if (TAVIWirelessApConfigSecNameGet(section, sizeof section) == 0) {
        TAVI_LOG_ERROR("Failed to get section name of %s", interface);
        return std::nullopt;
    }
    WirelessAPSettings settings;
    if (TAVIWirelessGetAPConfig(section, &settings) <= 0) {
        TAVI_LOG_ERROR("Failed to get ap info of secname[%s]", section);
        return std::nullopt;
    }
    if (settings.enabled == 0) {
        return std::nullopt;
    }
    return settings.ap;
}

std::optional<Bridge> SetUpBridge(const char* interface, const char* name) {
    if (const std::optional<Bridge> stored = StoredBridge(name)) {
        const std::string file = InterfaceFile(name);
        const bool isOnAtBoot = VEXACFileCheckKeyValue(file.c_str(), "ONBOOT", "yes", 0) != 0 ||
                                SetQuoted(file, "ONBOOT", "yes");
        return isOnAtBoot ? stored : std::nullopt;
    }
    const Bridge bridge = NewBridge(interface, name);
    if (TAVINetSetBridgeConfig(&bridge.config, &bridge.member) < 0) {
        TAVI_LOG_ERROR("Failed to set bridge config.");
        return std::nullopt;
    }
    return bridge;
}

bool IsIn(const TAVINetBridge& bridge, const char* address) {
    return TAVINetIsSameSubnet(address, bridge.address, bridge.netmask) != 0;
}

bool SetUpNewDhcpServer(const TAVINetBridge& bridge) {
    const std::optional<DhcpRange> range = DhcpRangeBehind(bridge.address, bridge.netmask);
    if (!range) {
        TAVI_LOG_ERROR("Failed to conver to inet_aton format of [%s] or [%s].", bridge.address,
                       bridge.netmask);
        return false;
    }
    if (!IsIn(bridge, range->start.c_str()) || !IsIn(bridge, range->end.c_str())) {
        TAVI_LOG_ERROR("Failed to get the valid range of dhcp server[%s].", bridge.name);
        return false;
    }
    TAVINetDhcpServer server{};
    server.enabled = 1;
    server.reserved = 30;
    server.leaseTime = kLeaseTime;
    CopyField(server.rangeStart, range->start);
    CopyField(server.rangeEnd, range->end);
    CopyField(server.interface, bridge.name);
    CopyField(server.bridge, bridge.name);
    CopyField(server.gateway, bridge.address);
    CopyField(server.nameServer, bridge.address);
    CopyField(server.netmask, bridge.netmask);
    if (TAVINetSetDhcpServerConfigFiles(&server, 1) == 0) {
        TAVI_LOG_ERROR("Failed to set dhcpServer conf for [%s].", bridge.name);
        return false;
    }
    return true;
}

// A service that fits the bridge's subnet is kept as it is, switched off by the user included.
bool SetUpDhcpServer(const TAVINetBridge& bridge) {
    TAVINetDhcpServer server;
    if (TAVINetGetDhcpServerConf(bridge.name, bridge.name, &server) < 0) {
        return SetUpNewDhcpServer(bridge);
    }
    const std::string info = DhcpServerInfo(bridge.name);
    const std::string putAside = DhcpServerPutAside(bridge.name);
    if (VEXACFileExist(putAside.c_str())) {
        VEXACSysRename(putAside.c_str(), info.c_str());
    }
    if (!IsIn(bridge, server.rangeStart) || !IsIn(bridge, server.rangeEnd)) {
        return SetUpNewDhcpServer(bridge);
    }
    return server.enabled == 0 || SetQuoted(info, "enable", "yes");
}

bool SetUpNetwork(const char* interface, const char* name) {
    const std::optional<Bridge> bridge = SetUpBridge(interface, name);
    if (!bridge ||
        (bridge->member.kind == TAVI_NET_MEMBER_WIRELESS && !SetUpDhcpServer(bridge->config))) {
        TAVI_LOG_ERROR("Failed to set bridge[%s] config.", name);
        return false;
    }
    return true;
}

// Compatible with the appliance's network script: the address is written for a bridge of the wired
// network as well, where it means nothing.
bool WriteInterfaceFile(const char* interface, const char* bridge) {
    const std::string file = InterfaceFile(interface);
    const std::pair<const char*, const char*> kLines[] = {
        {"ONBOOT", "yes"},         {"DEVICE", interface},      {"BRIDGE", bridge},
        {"IPADDR", kLocalAddress}, {"NETMASK", kLocalNetmask}, {"BOOTPROTO", "static"}};
    for (const auto& [key, value] : kLines) {
        if (VEXACFileSetKeyValue(file.c_str(), key, value, kPlainLine) <= 0) {
            TAVI_LOG_ERROR("Failed to set %s tavierr=[0x%04X]", file.c_str(), VEXACErrGet());
            return false;
        }
    }
    return true;
}

// Compatible with log readers: an empty name is reported later, with a message of its own.
bool CanJoin(const std::string& bridge) {
    const std::string reason = bridge.empty() ? "" : WhyNoBridge(bridge);
    if (!reason.empty()) {
        TAVI_LOG_ERROR("The bridge %s", reason.c_str());
        TAVI_LOG_ERROR("Failed to set bridge[%s] config.", bridge.c_str());
    }
    return reason.empty();
}

// Returns the bridge; nothing on failure.
std::optional<std::string> BringUp(const char* interface) {
    const std::optional<WirelessAPConf> conf = ReadSettings(interface);
    if (!conf || !CanJoin(conf->bridge)) {
        return std::nullopt;
    }
    if (TAVIWirelessSetHostAPConf(interface, &*conf) == 0) {
        TAVI_LOG_ERROR("Failed to set hostapd conf of interface [%s].", interface);
        return std::nullopt;
    }
    if (!SetQuoted(HostapdInfo(interface), "enable", "yes")) {
        return std::nullopt;
    }
    if (conf->bridge[0] == '\0') {
        TAVI_LOG_ERROR("Failed to find bridge interface.");
        return std::nullopt;
    }
    if (!SetUpNetwork(interface, conf->bridge) || !WriteInterfaceFile(interface, conf->bridge)) {
        return std::nullopt;
    }
    return conf->bridge;
}

// Waits until the adapter has channels to work on.
bool WaitForChannels(const char* interface) {
    const Command command(128, {"iwlist ", interface, " active_channel|wc -l"});
    for (int i = 0; i < kChannelTries; ++i) {
        const Pipe pipe(command);
        int count = 0;
        if (!pipe || fscanf(pipe.get(), " %d", &count) != 1) {
            TAVI_LOG_ERROR("Failed to execute [%s]", command.Described().c_str());
            return false;
        }
        if (count > 0) {
            return true;
        }
        TAVI_LOG_ERROR("Wait for wireless interface '%s' ready (%d)", interface, i);
        SleepOut(1);
    }
    return false;
}

int Enable() {
    const FlagFile flag(kAPFlag);
    if (!flag.Raise()) {
        TAVI_LOG_ERROR("Another ap construction is going");
        return 0;
    }
    const char* interface = TAVIWirelessAPInterfaceGet();
    const std::optional<std::string> bridge = BringUp(interface);
    if (!bridge) {
        TAVI_LOG_ERROR("Failed to enable AP.");
        return 0;
    }
    if (!WaitForChannels(interface)) {
        TAVI_LOG_ERROR("There is no wireless interface available");
        return 0;
    }
    if (VEXACExec(kNetworkScript, "restart", interface, bridge->c_str(), nullptr) != 0) {
        TAVI_LOG_ERROR("Failed to restart /etc/rc.network");
        return 0;
    }
    return 1;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessAPEnable() {
    return TAVI_GUARDED(0, taviwireless::wireless::Enable);
}
