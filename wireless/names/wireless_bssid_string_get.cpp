// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include <cstdio>

#include "common/log.h"

char* TAVIWirelessBssidStringGet(const unsigned char bssid[6], char* buf, size_t size) {
    if (bssid == nullptr || buf == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return buf;
    }
    snprintf(buf, size, "%02X:%02X:%02X:%02X:%02X:%02X", bssid[0], bssid[1], bssid[2], bssid[3],
             bssid[4], bssid[5]);
    return buf;
}
