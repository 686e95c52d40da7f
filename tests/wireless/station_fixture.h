// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_WIRELESS_STATION_FIXTURE_H
#define TAVIWIRELESS_TESTS_WIRELESS_STATION_FIXTURE_H

#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include <string>

#include "tests/support/log_capture.h"
#include "tests/wireless/scripted_driver.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {

inline constexpr char kFlag[] = "/var/tmp/.wireless_connecting";
inline constexpr char kRecord[] = "/var/tmp/.wireless_current_connection";
inline constexpr char kSupplicantFile[] = "/usr/tavi/etc/wpa_supplicant.conf";
inline constexpr char kSupplicantPid[] = "/var/run/wpa_supplicant.pid";
inline constexpr char kSavedFile[] = "/usr/tavi/etc/wireless.conf";
inline constexpr char kKey[] = "a secret";

// An appliance that was never connected, with an adapter that is up, and stand-ins for the tools.
// wpa_supplicant quotes the key wherever it can, as the real one does with one that it rejects; the
// real one is beside it as wpa_supplicant.real. What wpa_cli says is in /tmp/state.
struct Station {
    Station() {
        Shell(
            "cd /usr/sbin; [ -e wpa_supplicant.real ] || cp wpa_supplicant wpa_supplicant.real\n"
            "rm -rf /usr/tavi/etc /etc/dhcpc /etc/resolv.conf /etc/resolv.conf.wireless.bak"
            " /var/tmp/.wireless_connecting /var/tmp/.wireless_current_connection"
            " /var/run/wpa_supplicant /var/run/wpa_supplicant.pid /tmp/started /tmp/wireless.info\n"
            "rm -f /etc/taviinfo.conf /etc/rc.mediaservice\n"
            "mkdir -p /usr/tavi/etc /etc/dhcpc; echo wpa_state=COMPLETED > /tmp/state");
        tools.ForgetCommands();
        tools.Add("/usr/sbin/wpa_supplicant",
                  "cat " + std::string(kSupplicantFile) + " >&2; touch /tmp/started");
        tools.Add("/usr/sbin/wpa_cli",
                  "[ $1 = status ] || { rm -f /var/run/wpa_supplicant.pid; exit; }\n"
                  "until [ -e /tmp/started ]; do sleep 0.01; done\n"
                  "echo bssid=00:11:22:aa:bb:cc; cat /tmp/state");
        tools.Add("/sbin/iwconfig");
        tools.Add("/sbin/ifconfig");
        adapter.Up();
    }
    ~Station() { EXPECT_FALSE(log.Has(kKey)); }

    ToolStandIns tools;
    WirelessInterface adapter;
    ScriptedDriver driver;
    LogCapture log;
};

// A saved network of WPA2 with AES.
inline WirelessConf MakeConf(const std::string& essid = "My Net", const std::string& key = kKey,
                             int auth = WIRELESS_AUTH_WPA2_PSK,
                             int encrypt = WIRELESS_ENCRYPT_AES) {
    WirelessConf conf{};
    essid.copy(conf.network.essid, sizeof conf.network.essid - 1);
    key.copy(conf.key, sizeof conf.key - 1);
    constexpr unsigned char kBssid[] = {0x00, 0x11, 0x22, 0xaa, 0xbb, 0xcc};
    std::copy(std::begin(kBssid), std::end(kBssid), conf.network.bssid);
    conf.network.opmode = WIRELESS_OPMODE_MANAGED;
    conf.network.auth = auth;
    conf.network.encrypt = encrypt;
    std::string("me@home").copy(conf.user, sizeof conf.user - 1);
    std::string("DHCP").copy(conf.ipAddr, sizeof conf.ipAddr - 1);
    return conf;
}

}  // namespace taviwireless::test

#endif
