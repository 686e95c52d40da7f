// SPDX-License-Identifier: MIT
// Joining a saved network, the last used first.
#include <tavisdk/wireless.h>
#include <taviwireless/wireless.h>

#include <string>

#include "common/log.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"
#include "wireless/system/queue.h"

namespace taviwireless::wireless {

namespace {

// Whether it is worth trying to join the network. One in range gets its settings from the scan. One
// that is not may be hidden or silent: its saved settings are tried, if there are any, once a
// second scan has not found it either.
bool IsWorthTrying(WirelessConf& conf) {
    for (int lookup = 0; lookup < 2; ++lookup) {
        WirelessNetwork found;
        if (TAVIWirelessNetworkGet(conf.network.bssid, WIRELESS_KEY_BSSID, &found) == 1) {
            conf.network = found;
            return true;
        }
        if (conf.network.auth == WIRELESS_AUTH_UNKNOWN ||
            conf.network.encrypt == WIRELESS_ENCRYPT_UNKNOWN) {
            return false;
        }
        if (conf.network.protocol != WIRELESS_PROTOCOL_UNKNOWN) {
            return true;
        }
    }
    return true;
}

// The network that was joined, or null.
const WirelessConf* ConnectFirst(OwnedList<WirelessConf>& confs) {
    if (TAVIWirelessConfEnumByAtime(confs.Head()) != 0) {
        TAVI_LOG_ERROR("Failed to enumerate wireless network configurations");
        return nullptr;
    }
    for (WirelessConf& conf : confs) {
        if (IsWorthTrying(conf) && TAVIWirelessNetworkConnect(&conf) == 0) {
            return &conf;
        }
    }
    return nullptr;
}

bool ConnectSavedNetwork() {
    const std::string interface = WirelessInterface();
    if (interface.empty()) {
        TAVI_LOG_ERROR("Bad parameters");
        return false;
    }
    OwnedList<WirelessConf> confs;
    const WirelessConf* joined = ConnectFirst(confs);
    if (joined == nullptr) {
        TAVI_LOG_ERROR("Failed to connect any access point");
        return false;
    }
    if (TAVIWirelessIfconfigSet(interface.c_str(), joined) < 0) {
        TAVI_LOG_ERROR("Failed to set interface configuration");
        return false;
    }
    return true;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessAutoConnect() {
    using namespace taviwireless::wireless;
    const int status = TAVIWirelessConnStatusGet();
    if (status == WIRELESS_STATUS_CONNECTED || status == WIRELESS_STATUS_ADHOC) {
        TAVI_LOG_ERROR("Connection exists");
    } else if (TAVI_GUARDED(false, ConnectSavedNetwork)) {
        return 0;
    }
    TAVIWirelessNetworkDisconnect();
    return -1;
}
