// SPDX-License-Identifier: MIT
// Switching the access point off.
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavicore/process.h>
#include <tavisdk/bridge.h>
#include <taviwireless/wireless.h>

#include <algorithm>
#include <vector>

#include "base/interface_name.h"
#include "common/log.h"
#include "common/sz_list.h"
#include "wireless/rules/paths.h"
#include "wireless/system/guarded.h"

namespace taviwireless::wireless {

namespace {

// The SDK removes lines whose whole text is known, so the key first gets a line without value.
bool RemoveKey(const std::string& file, const char* key) {
    return VEXACFileSetKeyValue(file.c_str(), key, "", kPlainLine) > 0 &&
           VEXACFileRemoveLine(file.c_str(), (std::string(key) + '=').c_str()) > 0;
}

void SetOfBridge(const char* bridge, const char* key, const char* value) {
    const std::string file = InterfaceFile(bridge);
    if (VEXACFileSetKeyValue(file.c_str(), key, value, kPlainLine) <= 0) {
        TAVI_LOG_ERROR("Failed to set file[%s].", file.c_str());
    }
}

// The bridge goes on with the other members, or is switched off when there are none.
void LeaveBridge(const char* interface, const char* bridge) {
    SzList names(1024);
    if (!names) {
        TAVI_LOG_ERROR("Failed to alloc pList");
        VEXACErrSet(VEXAC_ERR_OUT_OF_MEMORY);
        return;
    }
    if (VEXANetBridgeSlaveEnum(bridge, names.Address()) < 0) {
        TAVI_LOG_ERROR("Failed to get number of slave for bridge [%s].", bridge);
        return;
    }
    std::vector<std::string> members;
    for (int i = 0; i < names.Count(); ++i) {
        members.emplace_back(names[i]);
    }
    const auto own = std::find(members.begin(), members.end(), interface);
    if (own == members.end() && !members.empty()) {
        return;
    }
    if (members.size() <= 1) {
        SetOfBridge(bridge, "ONBOOT", "no");
        return;
    }
    members.erase(own);
    SetOfBridge(bridge, "PRIMARY", members.front().c_str());
}

// The settings are kept for the next time.
bool PutDhcpServerAside(const char* bridge) {
    const std::string info = DhcpServerInfo(bridge);
    if (VEXACFileExist(info.c_str())) {
        VEXACSysRename(info.c_str(), DhcpServerPutAside(bridge).c_str());
    }
    TAVINetDhcpServer server;
    return TAVINetGetDhcpServerConf(bridge, bridge, &server) < 0 ||
           TAVINetSetDhcpServerConfigFiles(&server, 0) != 0;
}

// bridge gets the name of the bridge that the interface was in, or the empty text when it was in
// none or its file has no name there.
template <size_t kSize>
bool TakeDown(const char* interface, char (&bridge)[kSize]) {
    bridge[0] = '\0';
    const std::string info = HostapdInfo(interface);
    if (VEXACFileExist(info.c_str())) {
        VEXACSysUnlink(info.c_str());
    }
    const std::string file = InterfaceFile(interface);
    if (!VEXACFileExist(file.c_str())) {
        TAVI_LOG_ERROR("File[%s] does not exist.", file.c_str());
        return false;
    }
    const bool hasBridge = VEXACFileGetKeyValue(file.c_str(), "BRIDGE", bridge, kSize) > 0;
    if (hasBridge) {
        if (IsInterfaceName(bridge)) {
            LeaveBridge(interface, bridge);
        } else {
            TAVI_LOG_ERROR("Failed to get number of slave for bridge [%s].", bridge);
            bridge[0] = '\0';
        }
    }
    const bool isDone = bridge[0] == '\0' || PutDhcpServerAside(bridge);
    // Last, since a call that is killed before lets the next one find the bridge.
    if (!RemoveKey(file, "BRIDGE") && hasBridge) {
        TAVI_LOG_ERROR("Failed to remove key %s in [%s].", "BRIDGE", file.c_str());
    }
    RemoveKey(file, "LOCAL_LAN");
    return isDone;
}

int Disable() {
    const char* interface = TAVIWirelessAPInterfaceGet();
    char bridge[TAVI_NET_IF_NAME_SIZE];
    if (!TakeDown(interface, bridge)) {
        TAVI_LOG_ERROR("Failed to set AP config files.");
        return 0;
    }
    if (VEXACExec(kNetworkScript, "restart", interface, bridge, nullptr) != 0) {
        TAVI_LOG_ERROR("Failed to restart /etc/rc.network");
        return 0;
    }
    return 1;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessAPDisable() {
    return TAVI_GUARDED(0, taviwireless::wireless::Disable);
}
