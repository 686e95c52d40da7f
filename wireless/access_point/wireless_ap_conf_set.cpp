// SPDX-License-Identifier: MIT
// Storing the settings of the access point.
#include <tavicore/section.h>
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/rules/paths.h"
#include "wireless/system/ap_store.h"
#include "wireless/system/guarded.h"
#include "wireless/system/section_store.h"

namespace taviwireless::wireless {

namespace {

int SwitchOff(const char* section) {
    if (VEXACFileSetSectionValue(kAPSettings, section, "enable", "no", kSectionLine) < 0) {
        TAVI_LOG_ERROR("Failed to set key[%s] of sec[%s] in file[%s].", "enable", section,
                       kAPSettings);
        return 0;
    }
    return 1;
}

bool IsKindStorable(int32_t kind) {
    if (kind < WIRELESS_AP_OPEN || kind > WIRELESS_AP_WPA_ENTERPRISE) {
        TAVI_LOG_ERROR("Wrong encryption");
        return false;
    }
    return true;
}

bool IsSecurityStorable(const WirelessAPConf& ap) {
    if (!IsKindStorable(ap.security)) {
        return false;
    }
    if (ap.guestSecurity == WIRELESS_AP_WPA_ENTERPRISE) {
        TAVI_LOG_ERROR("Guest Network does not have EAP encryption");
        return false;
    }
    return IsKindStorable(ap.guestSecurity);
}

int Store(const WirelessAPSettings* settings) {
    if (settings == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return 0;
    }
    const Found found = FindAPSection(settings->name, __FILE_NAME__, __LINE__);
    if (found == Found::kFailed) {
        return 0;
    }
    if (settings->enabled == 0) {
        return SwitchOff(settings->name);
    }
    if (!IsSecurityStorable(settings->ap)) {
        return 0;
    }
    return SaveAPSettings(*settings, found, __FILE_NAME__, __LINE__);
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessSetAPConfig(const WirelessAPSettings* settings) {
    return TAVI_GUARDED(0, [settings] { return taviwireless::wireless::Store(settings); });
}
