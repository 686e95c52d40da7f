// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include <cstring>

#include "common/log.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"
#include "wireless/system/link_quality.h"

namespace taviwireless::wireless {

namespace {

constexpr int kSupposedSignal = 70;  // many drivers measure none in ad-hoc mode

// In a network's name "%%" stands for one percent sign; everything else is what it is.
void CopyEssid(const char* essid, char* out) {
    for (; *essid != '\0'; ++essid) {
        *out++ = *essid;
        if (essid[0] == '%' && essid[1] == '%') {
            ++essid;
        }
    }
    *out = '\0';
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessAdhocNetworkGet(WirelessNetwork* out) {
    using namespace taviwireless::wireless;
    if (out == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    *out = {};
    out->opmode = TAVIWirelessOpmodeGet();
    if (out->opmode != WIRELESS_OPMODE_ADHOC) {
        TAVI_LOG_ERROR("%s is not Ad-Hoc mode.", WirelessInterface().c_str());
        return -1;
    }
    // What the driver refuses to tell stays zero.
    WirelessInfo essid{};
    WirelessInfo protocol{};
    WirelessInfo keyState{};
    TAVIWirelessCurInfoGet(WIRELESS_INFO_ESSID, &essid);
    TAVIWirelessCurInfoGet(WIRELESS_INFO_PROTOCOL, &protocol);
    TAVIWirelessCurInfoGet(WIRELESS_INFO_KEY_STATE, &keyState);
    CopyEssid(essid.essid, out->essid);
    out->protocol = protocol.value;
    out->auth = keyState.value;  // open without a key, shared with one
    out->encrypt = out->auth == WIRELESS_AUTH_SHARED ? WIRELESS_ENCRYPT_WEP : WIRELESS_ENCRYPT_NONE;
    const auto quality = TAVI_GUARDED(std::optional<LinkQuality>(), ReadLinkQuality);
    out->signal = quality ? quality->value : kSupposedSignal;
    return 0;
}
