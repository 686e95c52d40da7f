// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

int TAVIWirelessConnStatusGet() {
    WirelessInfo info{};
    TAVIWirelessCurInfoGet(WIRELESS_INFO_CONN_STATUS, &info);
    return info.value;
}
