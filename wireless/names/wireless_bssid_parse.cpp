// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include <algorithm>
#include <cstdio>

#include "common/log.h"

int TAVIWirelessBssidParse(const char* text, unsigned char bssid[6]) {
    if (text == nullptr || bssid == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    unsigned long long groups[6];
    if (sscanf(text, " %llx:%llx:%llx:%llx:%llx:%llx", &groups[0], &groups[1], &groups[2],
               &groups[3], &groups[4], &groups[5]) < 6) {
        TAVI_LOG_ERROR("Failed to parse BSSID '%s'", text);
        return -1;
    }
    std::transform(groups, groups + 6, bssid,
                   [](unsigned long long group) { return static_cast<unsigned char>(group); });
    return 0;
}
