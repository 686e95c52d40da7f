// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include <iterator>

#include "base/glob.h"
#include "common/log.h"

int TAVIWirelessAdapterNum() {
    const taviwireless::FolderMatches adapters("/sys/class/net/wlan*");
    if (adapters.Fault() != nullptr) {
        TAVI_LOG_ERROR("%s", adapters.Fault());
        return -1;
    }
    return static_cast<int>(std::distance(adapters.begin(), adapters.end()));
}
