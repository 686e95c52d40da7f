#include "wireless/supplicant.h"

#include <algorithm>
#include <cstring>

namespace taviwireless::wireless {

namespace {

// The supplicant takes what stands between the first and the last quote of a line, so quotes and
// backslashes within need no escaping, and must not have any.
std::string Quoted(const char* text) {
    return std::string("\"") + text + "\"";
}

std::string Line(const char* key, const std::string& value) {
    return std::string("\t") + key + "=" + value + "\n";
}

std::string BssidLine(const WirelessConf& conf) {
    const unsigned char* bssid = conf.network.bssid;
    const bool isKnown = std::any_of(bssid, bssid + sizeof conf.network.bssid,
                                     [](unsigned char byte) { return byte != 0; });
    if (!isKnown || conf.anyBssid != 0) {
        return "";
    }
    char text[18];
    return Line("bssid", TAVIWirelessBssidStringGet(bssid, text, sizeof text));
}

std::string PairwiseLine(int encrypt) {
    if ((encrypt & WIRELESS_ENCRYPT_TKIP_AES) == 0) {
        return "";
    }
    return Line("pairwise", TAVIWirelessEncryptStringGet(encrypt, 1));
}

std::string EnterpriseLines(const WirelessConf& conf) {
    return Line("key_mgmt", "WPA-EAP") + Line("eap", "TTLS PEAP") +
           PairwiseLine(conf.network.encrypt) + Line("identity", Quoted(conf.user)) +
           Line("password", Quoted(conf.key));
}

std::string PersonalLines(const WirelessConf& conf) {
    return Line("key_mgmt", "WPA-PSK") + PairwiseLine(conf.network.encrypt) +
           Line("psk", Quoted(conf.key));
}

// Empty when the key is none.
std::string WepKeyLine(const char* key) {
    switch (strlen(key)) {
        case 5:
        case 13:
            return Line("wep_key0", Quoted(key));
        case 10:
        case 26:  // hexadecimal
            return Line("wep_key0", key);
        default:
            return "";
    }
}

void AppendOpenOrWepLines(const WirelessConf& conf, SupplicantConf& rendered) {
    rendered.text += Line("key_mgmt", "NONE");
    if (conf.network.encrypt == WIRELESS_ENCRYPT_WEP) {
        const std::string key = WepKeyLine(conf.key);
        rendered.isWepKeyLeftOut = key.empty();
        rendered.text += key + Line("wep_tx_keyidx", "0") + Line("auth_alg", "OPEN SHARED");
    }
}

}  // namespace

SupplicantConf RenderSupplicantConf(const WirelessConf& conf) {
    SupplicantConf rendered;
    rendered.text = "ctrl_interface=/var/run/wpa_supplicant\nnetwork={\n" +
                    Line("ssid", Quoted(conf.network.essid)) + BssidLine(conf) +
                    Line("scan_ssid", "1");  // hidden networks are found, too
    switch (conf.network.auth) {
        case WIRELESS_AUTH_WPA_EAP:
        case WIRELESS_AUTH_WPA2_EAP:
            rendered.text += EnterpriseLines(conf);
            break;
        case WIRELESS_AUTH_WPA_PSK:
        case WIRELESS_AUTH_WPA2_PSK:
            rendered.text += PersonalLines(conf);
            break;
        case WIRELESS_AUTH_OPEN:
        case WIRELESS_AUTH_SHARED:
        case WIRELESS_AUTH_WEP_AUTO:
            AppendOpenOrWepLines(conf, rendered);
            break;
        default:
            rendered.isAuthUnknown = true;
            return rendered;
    }
    rendered.text += "}\n";
    return rendered;
}

}  // namespace taviwireless::wireless
