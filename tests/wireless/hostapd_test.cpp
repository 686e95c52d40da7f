// SPDX-License-Identifier: MIT
// What hostapd is started with, and what happens to the one that runs.
#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include "tests/support/log_capture.h"
#include "tests/wireless/wifi_fixture.h"
#include "wireless/rules/hostapd_conf.h"

namespace taviwireless::test {
namespace {

using testing::EndsWith;
using testing::HasSubstr;
using testing::Not;
using wireless::RenderGuestConf;
using wireless::RenderHostConf;

constexpr char kHostFile[] = "/etc/hostapd/hostapd-wlan0-host.conf";
constexpr char kGuestFile[] = "/etc/hostapd/hostapd-wlan0-guest.conf";
constexpr char kGuestInfo[] = "/etc/hostapd/hostapd-wlan0-guest.info";
constexpr char kModelInfo[] = "/etc.defaults/taviinfo.conf";

WirelessAPSecret MakeSecret(int kind, int32_t cipher) {
    WirelessAPSecret secret{};
    if (kind == WIRELESS_AP_WPA) {
        secret.wpa.wpaVersion = 3;
        secret.wpa.cipher = cipher;
        CopyField(secret.wpa.passphrase, "pass = phrase");
    } else if (kind == WIRELESS_AP_WPA_ENTERPRISE) {
        secret.enterprise.wpaVersion = 2;
        secret.enterprise.cipher = cipher;
        secret.enterprise.radiusPort = 1812;
        CopyField(secret.enterprise.radiusAddr, "10.0.0.9");
        CopyField(secret.enterprise.radiusSecret, "radius secret");
    }
    return secret;
}

// Open, at 2.4 GHz with 802.11n, for guests as well.
WirelessAPConf MakeConf() {
    WirelessAPConf conf{};
    CopyField(conf.ssid, "My \"Net\" #1");
    CopyField(conf.bridge, "lbr0");
    conf.band = WIRELESS_AP_G;
    conf.ieee80211n = 1;
    conf.channel = 11;
    conf.wmm = 7;
    conf.guestEnabled = 1;
    CopyField(conf.guestSsid, "Guests");
    CopyField(conf.guestBssid, "02:00:00:00:00:01");
    return conf;
}

std::string HostText(const WirelessAPConf& conf) {
    return RenderHostConf("wlan0", conf).Text();
}

const std::string kGoldenHead =
    "interface=wlan0\ndriver=nl80211\nssid=My \"Net\" #1\nignore_broadcast_ssid=0\n"
    "macaddr_acl=0\nwpa_psk_file=/etc/hostapd.psk\nwps_state=2\nap_setup_locked=1\n"
    "ctrl_interface=/var/run/hostapd\nconfig_methods=label display push_button keypad\n";
const std::string kGoldenOpen = kGoldenHead +
                                "bridge=lbr0\nchannel=11\nieee80211n=1\n"
                                "ht_capab=[SHORT-GI-20][DELAYED-BA]\nwmm_enabled=1\nhw_mode=g\n"
                                "eap_server=1\nauth_algs=1\n";

TEST(HostConf, IsWrittenLineByLine) {
    WirelessAPConf conf = MakeConf();
    EXPECT_EQ(HostText(conf), kGoldenOpen);

    conf.hidden = 1;
    conf.maxStations = 12;
    conf.ieee80211n = conf.wmm = 0;
    conf.band = WIRELESS_AP_N_ONLY;
    conf.security = WIRELESS_AP_WPA;
    conf.secret = MakeSecret(conf.security, WIRELESS_AP_CCMP);
    std::string head = kGoldenHead;
    head.replace(head.find("ssid=0"), 6, "ssid=1");
    EXPECT_EQ(HostText(conf), head +
                                  "max_num_sta=12\nbridge=lbr0\nchannel=11\nwmm_enabled=0\n"
                                  "require_ht=1\nhw_mode=g\neap_server=1\nauth_algs=1\nwpa=3\n"
                                  "wpa_key_mgmt=WPA-PSK\nwpa_passphrase=pass = phrase\n"
                                  "wpa_pairwise=CCMP\nrsn_pairwise=CCMP\n");

    conf.security = WIRELESS_AP_WPA_ENTERPRISE;
    conf.secret = MakeSecret(conf.security, WIRELESS_AP_TKIP | WIRELESS_AP_CCMP);
    EXPECT_THAT(HostText(conf),
                EndsWith("\nrequire_ht=1\nhw_mode=g\neap_server=0\nauth_algs=1\nwpa=2\n"
                         "wpa_key_mgmt=WPA-EAP\nwpa_pairwise=TKIP CCMP\nrsn_pairwise=TKIP CCMP\n"
                         "ieee8021x=1\nauth_server_addr=10.0.0.9\nauth_server_port=1812\n"
                         "auth_server_shared_secret=radius secret\n"));
}

TEST(HostConf, HasTheModeAndWidthThatBandAndChannelAllow) {
    const struct {
        int band, n, htFlags, channel, security, cipher;
        std::string capabilities;  // the end of the line
        std::string mode;          // the lines between WMM and the EAP server
    } kCases[] = {
        {1, 1, 3, 44, 0, 0, "7935][HT40+]", "hw_mode=a\n"},
        {1, 1, 2, 52, 0, 0, "7935][HT40+]", "hw_mode=a\n"},
        {1, 1, 2, 64, 0, 0, "7935][HT40-]", "hw_mode=a\n"},
        {1, 1, 2, 149, 0, 0, "[MAX-AMSDU-7935]", "hw_mode=a\n"},
        {4, 1, 2, 5, 0, 0, "7935][HT40+]", "hw_mode=g\n"},
        {4, 1, 2, 6, 0, 0, "7935][HT40-]", "hw_mode=g\n"},
        {2, 2, 1, 3, 0, 0, "=[SHORT-GI-20][DELAYED-BA]", "hw_mode=b\n"},
        {9, 1, 2, 44, 0, 0, "7935][HT40-]", "hw_mode=a\n"},
        {12, 1, 0, 1, 0, 0, "[DELAYED-BA]", "hw_mode=g\n"},
        {12, 0, 0, 1, 0, 0, "", ""},
        {6, 1, 0, 1, 0, 0, "[DELAYED-BA]", ""},
        {8, 1, 0, 1, 2, 1, "[DELAYED-BA]", "hw_mode=g\n"},
        {8, 1, 0, 1, 1, 0, "[DELAYED-BA]", "hw_mode=g\n"},
        {8, 1, 0, 1, 2, 3, "[DELAYED-BA]", "require_ht=1\nhw_mode=g\n"},
        {8, 1, 0, 1, 3, 1, "[DELAYED-BA]", "require_ht=1\nhw_mode=g\n"},
        {8, 0, 0, 1, 0, 0, "", "require_ht=1\nhw_mode=g\n"},
    };
    for (const auto& c : kCases) {
        WirelessAPConf conf = MakeConf();
        conf.band = c.band;
        conf.ieee80211n = c.n;
        conf.htFlags = c.htFlags;
        conf.channel = c.channel;
        conf.security = c.security;
        conf.secret = MakeSecret(c.security, c.cipher);
        EXPECT_THAT(HostText(conf), HasSubstr((c.n != 0 ? c.capabilities : "channel=1") +
                                              "\nwmm_enabled=1\n" + c.mode + "eap_server="))
            << "band " << c.band << " channel " << c.channel << " security " << c.security;
    }
}

TEST(GuestConf, IsABlockWithoutEapServer) {
    WirelessAPConf conf = MakeConf();
    const std::string head =
        "bss=gwlan\nbssid=02:00:00:00:00:01\nssid=Guests\nbridge=gbr\n"
        "ctrl_interface=/var/run/hostapd\n";
    for (const int security : {WIRELESS_AP_OPEN, WIRELESS_AP_WPA_ENTERPRISE}) {
        conf.guestSecurity = security;
        EXPECT_EQ(RenderGuestConf(conf).Text(), head + "ignore_broadcast_ssid=0\n");
    }
    conf.guestSecurity = WIRELESS_AP_WPA;
    conf.guestHidden = 1;
    conf.guestIsolate = 5;
    conf.guestMaxStations = 3;
    conf.guestSecret = MakeSecret(conf.guestSecurity, WIRELESS_AP_TKIP);
    EXPECT_EQ(RenderGuestConf(conf).Text(),
              head +
                  "max_num_sta=3\nap_isolate=1\nignore_broadcast_ssid=1\nauth_algs=1\nwpa=3\n"
                  "wpa_key_mgmt=WPA-PSK\nwpa_passphrase=pass = phrase\nwpa_pairwise=TKIP\n"
                  "rsn_pairwise=TKIP\n");
}

// An appliance without hostapd's files; its ps lists every process with its arguments.
struct SetHostAPConf : testing::Test {
    SetHostAPConf() {
        Shell(
            "rm -rf /etc/hostapd /etc.defaults/taviinfo.conf /tmp/bin /tmp/hostapd; mkdir "
            "/tmp/bin\n"
            "ln -s /bin/busybox /tmp/bin/ps; printf '#!/bin/sh\\nread end\\n' > /tmp/hostapd\n"
            "chmod +x /tmp/hostapd");
        setenv("PATH", ("/tmp/bin:" + path).c_str(), 1);
        adapter.Up();
    }
    ~SetHostAPConf() override { setenv("PATH", path.c_str(), 1); }

    const std::string path = getenv("PATH");
    WirelessInterface adapter;
    LogCapture log;
    WirelessAPConf conf = MakeConf();
};

TEST_F(SetHostAPConf, StopsHostapdAndWritesFilesThatOthersCannotRead) {
    WriteFile(kHostFile, "old\n");
    Process other({"/tmp/hostapd", "/etc/hostapd/hostapd-wlan1.conf"});
    Process ours({"/tmp/hostapd", "/etc/hostapd/hostapd-wlan0.conf"});
    EXPECT_EQ(TAVIWirelessSetHostAPConf("wlan0", &conf), 1);
    EXPECT_EQ(ours.Wait(), 128 + SIGTERM);
    EXPECT_EQ(other.Wait(Process::Milliseconds(0)), std::nullopt);
    EXPECT_THAT(Shell("ip link show wlan0"), Not(HasSubstr("UP")));
    EXPECT_EQ(ReadFile(kHostFile), kGoldenOpen);
    EXPECT_EQ(FileMode(kHostFile), 0600u);
    EXPECT_FALSE(Exists(kGuestFile) || Exists(kGuestInfo));
    EXPECT_EQ(log.Text(), "");

    WriteFile(kModelInfo, "support_pci_wifi=\"yes\"\n");
    EXPECT_EQ(TAVIWirelessSetHostAPConf("wlan0", &conf), 1);
    EXPECT_EQ(ReadFile(kGuestInfo), "enable=yes\n");
    EXPECT_EQ(ReadFile(kGuestFile), RenderGuestConf(conf).Text());
    EXPECT_EQ(FileMode(kGuestInfo) | FileMode(kGuestFile), 0600u);
    conf.guestEnabled = 0;
    EXPECT_EQ(TAVIWirelessSetHostAPConf("wlan0", &conf), 1);
    EXPECT_EQ(ReadFile(kGuestInfo), "enable=no\n");
}

TEST_F(SetHostAPConf, AnInterfaceNameRunsNothingAndMatchesOnlyItself) {
    Process other({"/tmp/hostapd", "wlan0x1", "/etc/hostapd/hostapd-"});
    EXPECT_EQ(TAVIWirelessSetHostAPConf("wlan0.1", &conf), 1);
    for (const char* none :
         {"", "w*", "$(>x)", "`>x`;>x", "#", "-x", "a b", "a/b", "..", "0123456789abcdef"}) {
        EXPECT_EQ(TAVIWirelessSetHostAPConf(none, &conf), 0) << none;
    }
    EXPECT_EQ(other.Wait(Process::Milliseconds(50)), std::nullopt);
    EXPECT_FALSE(Exists("x"));
}

TEST_F(SetHostAPConf, RefusesLineBreaksBeforeAnythingIsDone) {
    CopyField(conf.guestSsid, "a\nb");  // which this model does not write
    EXPECT_EQ(TAVIWirelessSetHostAPConf("wlan0", &conf), 1);
    adapter.Up();
    Shell("rm -r /etc/hostapd");
    WriteFile(kModelInfo, "support_pci_wifi=yes\n");
    EXPECT_EQ(TAVIWirelessSetHostAPConf("wlan0", &conf), 0);
    conf = MakeConf();
    conf.security = WIRELESS_AP_WPA;
    CopyField(conf.secret.wpa.passphrase, "secret\rauth_algs=1");
    EXPECT_EQ(TAVIWirelessSetHostAPConf("wlan0", &conf), 0);
    EXPECT_EQ(log.Count("holds a line break"), 2);
    EXPECT_FALSE(log.Has("secret"));
    EXPECT_THAT(Shell("ip link show wlan0"), HasSubstr("UP"));
    EXPECT_FALSE(Exists("/etc/hostapd"));
}

}  // namespace
}  // namespace taviwireless::test
