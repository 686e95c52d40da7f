// SPDX-License-Identifier: MIT
#include "wireless/rules/hostapd_conf.h"

#include <optional>

#include "wireless/rules/bridge_names.h"
#include "wireless/rules/line_break.h"
#include "wireless/rules/paths.h"
#include "wireless/rules/radio.h"
#include "wireless/rules/security.h"

namespace taviwireless::wireless {

namespace {

// Values of hostapd's key "auth_algs".
constexpr int kOpenSystem = 1;
constexpr int kOpenSystemOrSharedKey = 3;

void AddIfPositive(HostapdConf& lines, const char* key, int32_t value) {
    if (value > 0) {
        lines.Add(key, value);
    }
}

std::string HtCapabilities(const WirelessAPConf& conf) {
    const std::string narrow = "[SHORT-GI-20][DELAYED-BA]";
    return IsWide(conf)
               ? narrow + "[SHORT-GI-40][MAX-AMSDU-7935]" + SecondHalf(conf.band, conf.channel)
               : narrow;
}

// 802.11n itself knows neither WEP nor TKIP.
bool CanRequireN(const WirelessAPConf& conf) {
    return conf.security != WIRELESS_AP_WEP &&
           !(conf.security == WIRELESS_AP_WPA && conf.secret.wpa.cipher == WIRELESS_AP_TKIP);
}

void AddMode(HostapdConf& lines, const WirelessAPConf& conf) {
    switch (BandInUse(conf)) {
        case WIRELESS_AP_A:
            lines.Add("hw_mode", "a");
            break;
        case WIRELESS_AP_B:
            lines.Add("hw_mode", "b");
            break;
        case WIRELESS_AP_G:
            lines.Add("hw_mode", "g");
            break;
        case WIRELESS_AP_N_ONLY:
            if (CanRequireN(conf)) {
                lines.Add("require_ht", 1);
            }
            lines.Add("hw_mode", "g");
            break;
        default:
            break;
    }
}

void AddPairwise(HostapdConf& lines, int32_t cipher) {
    constexpr const char* kNames[] = {nullptr, "TKIP", "CCMP", "TKIP CCMP"};
    if (cipher >= WIRELESS_AP_TKIP && cipher <= (WIRELESS_AP_TKIP | WIRELESS_AP_CCMP)) {
        lines.Add("wpa_pairwise", kNames[cipher]);
        lines.Add("rsn_pairwise", kNames[cipher]);
    }
}

void AddWep(HostapdConf& lines, const char* key) {
    lines.Add("auth_algs", kOpenSystemOrSharedKey);
    lines.Add("wep_default_key", 0);
    if (const std::optional<std::string> value = WepKeyValue(key)) {
        lines.AddSecret("wep_key0", *value);
    }
}

void AddPersonal(HostapdConf& lines, const WirelessAPSecret& secret) {
    lines.Add("auth_algs", kOpenSystem);
    lines.Add("wpa", secret.wpa.wpaVersion);
    lines.Add("wpa_key_mgmt", "WPA-PSK");
    lines.AddSecret("wpa_passphrase", secret.wpa.passphrase);
    AddPairwise(lines, secret.wpa.cipher);
}

void AddEnterprise(HostapdConf& lines, const WirelessAPSecret& secret) {
    lines.Add("auth_algs", kOpenSystem);
    lines.Add("wpa", secret.enterprise.wpaVersion);
    lines.Add("wpa_key_mgmt", "WPA-EAP");
    AddPairwise(lines, secret.enterprise.cipher);
    lines.Add("ieee8021x", 1);
    lines.Add("auth_server_addr", secret.enterprise.radiusAddr);
    lines.Add("auth_server_port", secret.enterprise.radiusPort);
    lines.AddSecret("auth_server_shared_secret", secret.enterprise.radiusSecret);
}

void AddSecurity(HostapdConf& lines, const WirelessAPConf& conf) {
    // hostapd's own server also serves WPS; with enterprise security there is another one.
    lines.Add("eap_server", conf.security == WIRELESS_AP_WPA_ENTERPRISE ? 0 : 1);
    switch (conf.security) {
        case WIRELESS_AP_WEP:
            AddWep(lines, conf.secret.wepKey);
            break;
        case WIRELESS_AP_WPA:
            AddPersonal(lines, conf.secret);
            break;
        case WIRELESS_AP_WPA_ENTERPRISE:
            AddEnterprise(lines, conf.secret);
            break;
        default:
            lines.Add("auth_algs", kOpenSystem);
            break;
    }
}

}  // namespace

void HostapdConf::Add(const char* key, const std::string& value) {
    AddLine(key, value, value);
}

void HostapdConf::AddSecret(const char* key, const std::string& value) {
    AddLine(key, value, "********");
}

void HostapdConf::AddLine(const char* key, const std::string& value, const std::string& shown) {
    holdsLineBreak_ = holdsLineBreak_ || wireless::HoldsLineBreak(value);
    text_ += key + ("=" + value) + "\n";
    shown_ += key + ("=" + shown) + "\n";
}

void HostapdConf::Add(const char* key, int32_t value) {
    Add(key, std::to_string(value));
}

HostapdConf RenderHostConf(const std::string& interface, const WirelessAPConf& conf) {
    HostapdConf lines;
    lines.Add("interface", interface);
    lines.Add("driver", "nl80211");
    lines.Add("ssid", conf.ssid);
    lines.Add("ignore_broadcast_ssid", conf.hidden);
    lines.Add("macaddr_acl", 0);
    lines.Add("wpa_psk_file", "/etc/hostapd.psk");
    lines.Add("wps_state", 2);
    lines.Add("ap_setup_locked", 1);
    lines.Add("ctrl_interface", kHostapdSockets);
    lines.Add("config_methods", "label display push_button keypad");
    AddIfPositive(lines, "max_num_sta", conf.maxStations);
    lines.Add("bridge", conf.bridge);
    lines.Add("channel", conf.channel);
    if (Is80211n(conf)) {
        lines.Add("ieee80211n", conf.ieee80211n);
        lines.Add("ht_capab", HtCapabilities(conf));
    }
    lines.Add("wmm_enabled", conf.wmm > 0 ? 1 : 0);
    AddMode(lines, conf);
    AddSecurity(lines, conf);
    return lines;
}

HostapdConf RenderGuestConf(const WirelessAPConf& conf) {
    HostapdConf lines;
    lines.Add("bss", kGuestInterface);
    // Compatible with the store, which is written with a BSSID of guests that is never read back:
    // so this line mostly has no value, and whoever starts hostapd leaves it out then.
    lines.Add("bssid", conf.guestBssid);
    lines.Add("ssid", conf.guestSsid);
    lines.Add("bridge", kGuestBridge);
    lines.Add("ctrl_interface", kHostapdSockets);
    AddIfPositive(lines, "max_num_sta", conf.guestMaxStations);
    if (conf.guestIsolate != 0) {
        lines.Add("ap_isolate", 1);
    }
    lines.Add("ignore_broadcast_ssid", conf.guestHidden);
    // The EAP server is a matter of the main network; an open guest network has no line at all.
    if (conf.guestSecurity == WIRELESS_AP_WEP) {
        AddWep(lines, conf.guestSecret.wepKey);
    } else if (conf.guestSecurity == WIRELESS_AP_WPA) {
        AddPersonal(lines, conf.guestSecret);
    }
    return lines;
}

}  // namespace taviwireless::wireless
