// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_AP_SETTINGS_H
#define TAVIWIRELESS_WIRELESS_RULES_AP_SETTINGS_H

#include <taviwireless/wireless.h>

#include <string>

#include "base/fixed_field.h"
#include "wireless/rules/bridge_names.h"

// The keys of a section of the access point's settings, in the order of the file, each with its
// default. Reading and writing visit the same table: a visitor has
//   Flag(key, number, value when missing)   "yes" or "no"
//   Number(key, number, value when missing)
//   Text(key, array, text when missing)
//   WriteOnly(key, array)
namespace taviwireless::wireless {

// A character per hour of a week: always on.
inline std::string FullSchedule() {
    return std::string(WIRELESS_AP_SCHEDULE_SIZE - 1, '1');
}

// The keys of a security kind begin with prefix. Other kinds have none.
template <typename Visitor, typename Secret>
void VisitSecret(Visitor&& visit, const std::string& prefix, int32_t kind, Secret& secret) {
    const auto key = [&prefix](const char* name) { return prefix + name; };
    switch (kind) {
        case WIRELESS_AP_WEP:
            visit.Text(key("wep_key0"), secret.wepKey, "");
            break;
        case WIRELESS_AP_WPA:
            visit.Number(key("wpa"), secret.wpa.wpaVersion, 2);
            visit.Text(key("wpa_passphrase"), secret.wpa.passphrase, "");
            visit.Number(key("wpa_encrypt_type"), secret.wpa.cipher, WIRELESS_AP_CCMP);
            break;
        case WIRELESS_AP_WPA_ENTERPRISE:
            visit.Number(key("wpa"), secret.enterprise.wpaVersion, 2);
            visit.Number(key("wpa_encrypt_type"), secret.enterprise.cipher, WIRELESS_AP_CCMP);
            visit.Text(key("auth_server_addr"), secret.enterprise.radiusAddr, "");
            visit.Number(key("auth_server_port"), secret.enterprise.radiusPort, 1812);
            visit.Text(key("auth_server_shared_secret"), secret.enterprise.radiusSecret, "");
            break;
        default:
            break;
    }
}

template <typename Visitor, typename Settings>
void VisitMainNetwork(Visitor&& visit, Settings& settings) {
    auto& ap = settings.ap;
    visit.Flag("enable", settings.enabled, 0);
    visit.Flag("unblock", settings.unblock, 1);
    visit.Number("txpower", settings.txPower, 10);
    visit.Text("ssid", ap.ssid, "Merilond");
    visit.Text("bridge", ap.bridge, kLocalBridge);
    visit.Text("wifi_sched", settings.schedule, FullSchedule());
    visit.Number("wifi_sched_enabled", settings.scheduleEnabled, 0);
    visit.Number("ignore_broadcast_ssid", ap.hidden, 0);
    visit.Number("hw_mode", ap.band, WIRELESS_AP_G);
    visit.Number("channel", ap.channel, 0);
    visit.Number("max_num_sta", ap.maxStations, 256);
    visit.Number("ieee80211n", ap.ieee80211n, 1);
    visit.Number("ieee80211n_wireless_width", ap.htFlags, 3);
    visit.Number("wmm_enabled", ap.wmm, 1);
    visit.Number("encryption", ap.security, WIRELESS_AP_OPEN);
    VisitSecret(visit, "", ap.security, ap.secret);
}

// Guests have no enterprise security: it has no keys here, and the caller logs it.
template <typename Visitor, typename Settings>
void VisitGuestNetwork(Visitor&& visit, Settings& settings) {
    auto& ap = settings.ap;
    visit.Number("guest_net_enable", ap.guestEnabled, 0);
    visit.WriteOnly("bssid", ap.guestBssid);
    visit.Text("guest_net_ssid", ap.guestSsid, "HarborstackGuest");
    visit.Number("guest_net_ignore_broadcast_ssid", ap.guestHidden, 0);
    visit.Number("guest_net_max_num_sta", ap.guestMaxStations, 256);
    visit.Number("ap_isolate", ap.guestIsolate, 1);
    visit.Number("guest_net_encryption", ap.guestSecurity, WIRELESS_AP_OPEN);
    if (ap.guestSecurity != WIRELESS_AP_WPA_ENTERPRISE) {
        VisitSecret(visit, "guest_net_", ap.guestSecurity, ap.guestSecret);
    }
    visit.Number("guest_net_lan_block", settings.guestLanBlock, 1);
    visit.Number("guest_net_access_hb", settings.guestAccessServer, 0);
    visit.Number("guest_net_internet_block", settings.guestInternetBlock, 0);
    visit.Number("guest_net_allow_http", settings.guestAllowHttp, 1);
    visit.Text("guest_net_sched", settings.guestSchedule, FullSchedule());
    visit.Number("guest_net_sched_enable", settings.guestScheduleEnabled, 0);
}

// A visitor that gives every field its default.
struct DefaultSetter {
    void Flag(const std::string&, int32_t& field, int32_t value) const { field = value; }
    void Number(const std::string&, int32_t& field, int32_t value) const { field = value; }
    template <size_t kSize>
    void Text(const std::string&, char (&field)[kSize], const std::string& value) const {
        CopyField(field, value);
    }
    template <size_t kSize>
    void WriteOnly(const std::string&, const char (&)[kSize]) const {}
};

}  // namespace taviwireless::wireless

#endif
