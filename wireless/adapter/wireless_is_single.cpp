// SPDX-License-Identifier: MIT
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/system/interface.h"

int TAVIWirelessIsSingle_core() {
    constexpr int kMost = 32;
    if (TAVIWirelessConnStatusGet() != WIRELESS_STATUS_CONNECTED) {
        return 0;
    }
    VEXANetInterfaceInfo interfaces[kMost];
    const int count = VEXANetGetInterfaceInfo(interfaces, kMost, VEXA_NET_ALL_INTERFACES);
    if (count < 0) {
        TAVI_LOG_ERROR("Failed to get the number of network cards");
        return 0;
    }
    for (int i = 0; i < count; ++i) {
        if (interfaces[i].linkState == VEXA_NET_LINK_CONNECTED &&
            interfaces[i].name != taviwireless::wireless::WirelessInterface()) {
            return 0;
        }
    }
    return 1;
}
