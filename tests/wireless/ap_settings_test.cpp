// SPDX-License-Identifier: MIT
// The stored settings of the access point.
#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include <cstring>

#include "tests/support/log_capture.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;

const std::string kFile = "/usr/tavi/etc/wireless_ap.conf";
const std::string kFullSchedule(168, '1');

// An appliance that never had an access point.
struct Settings {
    Settings() { Shell("rm -rf /usr/tavi/etc /tmp/bin /tmp/wireless.info; mkdir /usr/tavi/etc"); }
    LogCapture log;
};

WirelessAPSettings Defaults(const char* name = "Stick 2000") {
    WirelessAPSettings settings{};
    TAVIWirelessGetAPConfig(name, &settings);
    return settings;
}

TEST(GetAPConfig, GivesTheDefaultsOfTheMainNetworkWithoutASection) {
    Settings here;
    WirelessAPSettings s;
    for (const char* text : {"", "[other]\n\tenable=yes\n"}) {
        memset(&s, 0x55, sizeof s);
        EXPECT_EQ(TAVIWirelessGetAPConfig("Stick 2000", &s), 0);
        EXPECT_STREQ(s.ap.ssid, "Merilond");
        EXPECT_STREQ(s.ap.bridge, "lbr0");
        EXPECT_EQ(s.schedule, kFullSchedule);
        const std::vector<int32_t> numbers{s.enabled,       s.txPower,    s.unblock,
                                           s.ap.band,       s.ap.htFlags, s.ap.security,
                                           s.ap.channel,    s.ap.hidden,  s.ap.maxStations,
                                           s.ap.ieee80211n, s.ap.wmm,     s.scheduleEnabled};
        EXPECT_THAT(numbers, ElementsAre(0, 10, 1, 4, 3, 0, 0, 0, 256, 1, 1, 0));
        EXPECT_STREQ(s.ap.guestSsid, "");
        EXPECT_EQ(s.guestLanBlock + s.ap.guestMaxStations, 0);
        WriteFile(kFile, text);
    }
}

TEST(GetAPConfig, GivesDefaultsForMissingKeysOfASection) {
    const Settings here;
    WriteFile(kFile, "[Stick 2000]\n\tencryption=3\n\tbssid=02::\n\tguest_net_encryption=2\n");
    const WirelessAPSettings s = Defaults();
    EXPECT_STREQ(s.ap.ssid, "Merilond");
    EXPECT_EQ(s.ap.secret.enterprise.radiusPort, 1812);
    EXPECT_STREQ(s.ap.guestSsid, "HarborstackGuest");
    EXPECT_STREQ(s.ap.guestBssid, "");
    EXPECT_EQ(s.guestSchedule, kFullSchedule);
    const std::vector<int32_t> numbers{s.ap.guestMaxStations,
                                       s.ap.guestIsolate,
                                       s.guestLanBlock,
                                       s.guestAllowHttp,
                                       s.ap.guestSecret.wpa.wpaVersion,
                                       s.ap.guestSecret.wpa.cipher};
    EXPECT_THAT(numbers, ElementsAre(256, 1, 1, 1, 2, WIRELESS_AP_CCMP));
}

TEST(SetAPConfig, WritesEveryKeyInOrder) {
    const Settings here;
    WirelessAPSettings settings = Defaults();
    settings.enabled = 1;
    settings.ap.security = WIRELESS_AP_WPA_ENTERPRISE;
    settings.ap.secret = {};
    CopyField(settings.ap.secret.enterprise.radiusAddr, "10.0.0.9");
    settings.ap.guestSecurity = WIRELESS_AP_WPA;
    CopyField(settings.ap.guestSecret.wpa.passphrase, "for guests");
    CopyField(settings.ap.guestBssid, "02:00:00:00:00:01");
    EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 1);
    EXPECT_EQ(ReadFile(kFile),
              "[Stick 2000]\n\tenable=yes\n\tunblock=yes\n\ttxpower=10\n\tssid=Merilond\n"
              "\tbridge=lbr0\n\twifi_sched=" +
                  kFullSchedule +
                  "\n\twifi_sched_enabled=0\n\tignore_broadcast_ssid=0\n\thw_mode=4\n\tchannel=0\n"
                  "\tmax_num_sta=256\n\tieee80211n=1\n\tieee80211n_wireless_width=3\n"
                  "\twmm_enabled=1\n\tencryption=3\n\twpa=0\n\twpa_encrypt_type=0\n"
                  "\tauth_server_addr=10.0.0.9\n\tauth_server_port=0\n"
                  "\tauth_server_shared_secret=\n\tguest_net_enable=0\n\tbssid=02:00:00:00:00:01\n"
                  "\tguest_net_ssid=\n\tguest_net_ignore_broadcast_ssid=0\n"
                  "\tguest_net_max_num_sta=0\n\tap_isolate=0\n\tguest_net_encryption=2\n"
                  "\tguest_net_wpa=0\n\tguest_net_wpa_passphrase=for guests\n"
                  "\tguest_net_wpa_encrypt_type=0\n\tguest_net_lan_block=0\n"
                  "\tguest_net_access_hb=0\n\tguest_net_internet_block=0\n"
                  "\tguest_net_allow_http=0\n\tguest_net_sched=\n\tguest_net_sched_enable=0\n");
    EXPECT_EQ(FileMode(kFile), 0600u);
}

TEST(Settings, OfAStoreThatCannotBeLookedAtAreNotTheDefaults) {
    const Settings here;
    WirelessAPSettings settings = Defaults();
    settings.enabled = 1;
    WriteFile("/tmp/wireless.info", "PRODUCT=Stick 2000\n");
    for (const std::string& command : {std::string("mkdir "), "ln -s " + kFile + ' '}) {
        Shell("rm -rf " + kFile + "; " + command + kFile);
        EXPECT_EQ(TAVIWirelessGetAPConfig("Stick 2000", &settings), -1) << command;
        EXPECT_EQ(TAVIWirelessCheckBlock(), -1) << command;
        settings.enabled = 1;
        EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 0) << command;
    }
}

}  // namespace
}  // namespace taviwireless::test
