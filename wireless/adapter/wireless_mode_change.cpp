// SPDX-License-Identifier: MIT
// Switching the adapter between access point and client.
#include <tavicore/process.h>
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/rules/paths.h"

int TAVIWirelessModeChange(int mode) {
    constexpr const char* kModes[] = {"ap", "client"};
    if (mode != 0 && mode != 1) {
        TAVI_LOG_ERROR("Wrong Wireless Mode.");
        return 0;
    }
    const char* name = kModes[mode];
    if (VEXACExec(taviwireless::wireless::kHotplugScript, "change-mode", name, nullptr) != 0) {
        TAVI_LOG_ERROR("Failed to change to wireless %s mode.", mode == 0 ? "AP" : "client");
        return 0;
    }
    return 1;
}
