// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include <cstring>

#include "common/log.h"
#include "wireless/system/queue.h"

namespace taviwireless::wireless {

namespace {

bool Matches(const WirelessNetwork& network, const void* key, int keyKind) {
    switch (keyKind) {
        case WIRELESS_KEY_ESSID:
            return strcmp(network.essid, static_cast<const char*>(key)) == 0;
        case WIRELESS_KEY_BSSID:
            return memcmp(network.bssid, key, sizeof network.bssid) == 0;
        default:
            return true;
    }
}

bool Scan(int trigger, OwnedList<WirelessNetwork>& networks) {
    if (TAVIWirelessNetworkScan(trigger, networks.Head()) < 0) {
        TAVI_LOG_ERROR("Failed to scan wireless networks");
        return false;
    }
    return true;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessNetworkGet(const void* key, int keyKind, WirelessNetwork* out) {
    using namespace taviwireless::wireless;
    if (key == nullptr || out == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    OwnedList<WirelessNetwork> networks;
    if (!Scan(0, networks) || (IsEmpty(*networks.Head()) && !Scan(1, networks))) {
        return -1;
    }
    for (const WirelessNetwork& network : networks) {
        if (Matches(network, key, keyKind)) {
            *out = network;
            out->link = {};  // its neighbours are freed with the list
            return 1;
        }
    }
    return 0;
}
