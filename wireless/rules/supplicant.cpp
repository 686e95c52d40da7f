// SPDX-License-Identifier: MIT
#include "wireless/rules/supplicant.h"

#include <algorithm>
#include <optional>

#include "wireless/rules/line_break.h"
#include "wireless/rules/paths.h"
#include "wireless/rules/security.h"

namespace taviwireless::wireless {

namespace {

// The supplicant takes what stands between the first and the last quote of a line, so quotes and
// backslashes within need no escaping, and must not have any. Before that it drops comments, for
// which each quote begins or ends a text: see IsCutBySupplicant.
std::string Quoted(const char* text) {
    return std::string("\"") + text + "\"";
}

void Add(SupplicantConf& rendered, const char* key, const std::string& value) {
    rendered.holdsLineBreak = rendered.holdsLineBreak || HoldsLineBreak(value);
    rendered.text += std::string("\t") + key + "=" + value + "\n";
}

void AddBssid(SupplicantConf& rendered, const WirelessConf& conf) {
    const unsigned char* bssid = conf.network.bssid;
    const bool isKnown = std::any_of(bssid, bssid + sizeof conf.network.bssid,
                                     [](unsigned char byte) { return byte != 0; });
    if (isKnown && conf.anyBssid == 0) {
        char text[18];
        Add(rendered, "bssid", TAVIWirelessBssidStringGet(bssid, text, sizeof text));
    }
}

void AddPairwise(SupplicantConf& rendered, int encrypt) {
    if ((encrypt & WIRELESS_ENCRYPT_TKIP_AES) != 0) {
        Add(rendered, "pairwise", TAVIWirelessEncryptStringGet(encrypt, 1));
    }
}

void AddEnterprise(SupplicantConf& rendered, const WirelessConf& conf) {
    Add(rendered, "key_mgmt", "WPA-EAP");
    Add(rendered, "eap", "TTLS PEAP");
    AddPairwise(rendered, conf.network.encrypt);
    Add(rendered, "identity", Quoted(conf.user));
    Add(rendered, "password", Quoted(conf.key));
}

void AddPersonal(SupplicantConf& rendered, const WirelessConf& conf) {
    Add(rendered, "key_mgmt", "WPA-PSK");
    AddPairwise(rendered, conf.network.encrypt);
    Add(rendered, "psk", Quoted(conf.key));
}

void AddOpenOrWep(SupplicantConf& rendered, const WirelessConf& conf) {
    Add(rendered, "key_mgmt", "NONE");
    if (conf.network.encrypt == WIRELESS_ENCRYPT_WEP) {
        const std::optional<std::string> key = WepKeyValue(conf.key);
        rendered.isWepKeyLeftOut = !key;
        if (key) {
            Add(rendered, "wep_key0", *key);
        }
        Add(rendered, "wep_tx_keyidx", "0");
        Add(rendered, "auth_alg", "OPEN SHARED");
    }
}

}  // namespace

bool IsCutBySupplicant(const std::string& text) {
    bool isWithinQuotes = true;
    for (const char c : text) {
        if (c == '#' && !isWithinQuotes) {
            return true;
        }
        isWithinQuotes = isWithinQuotes != (c == '"');
    }
    return false;
}

SupplicantConf RenderSupplicantConf(const WirelessConf& conf) {
    SupplicantConf rendered;
    rendered.text = std::string("ctrl_interface=") + kSupplicantSockets + "\nnetwork={\n";
    Add(rendered, "ssid", Quoted(conf.network.essid));
    AddBssid(rendered, conf);
    Add(rendered, "scan_ssid", "1");  // hidden networks are found, too
    switch (SecurityOf(conf.network)) {
        case Security::kEAP:
            AddEnterprise(rendered, conf);
            break;
        case Security::kWPA:
            AddPersonal(rendered, conf);
            break;
        case Security::kOpen:
        case Security::kWEP:
            AddOpenOrWep(rendered, conf);
            break;
        default:
            rendered.isAuthUnknown = true;
            return rendered;
    }
    rendered.text += "}\n";
    return rendered;
}

}  // namespace taviwireless::wireless
