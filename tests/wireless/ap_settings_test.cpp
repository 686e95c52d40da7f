// The stored settings of the access point.
#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include <cstring>
#include <random>

#include "tests/support/log_capture.h"
#include "tests/wireless/failing_stat.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

using testing::EndsWith;
using testing::HasSubstr;

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

void ExpectMainDefaults(const WirelessAPSettings& s) {
    EXPECT_STREQ(s.name, "Stick 2000");
    EXPECT_STREQ(s.ap.ssid, "Merilond");
    EXPECT_STREQ(s.ap.bridge, "lbr0");
    EXPECT_EQ(s.schedule, kFullSchedule);
    const std::vector<int32_t> numbers{s.enabled,        s.txPower,         s.unblock,
                                       s.ap.band,        s.ap.htFlags,      s.ap.security,
                                       s.ap.maxStations, s.scheduleEnabled, s.ap.hidden,
                                       s.ap.channel,     s.ap.ieee80211n,   s.ap.wmm};
    EXPECT_THAT(numbers, testing::ElementsAre(0, 10, 1, 4, 3, 0, 256, 0, 0, 0, 1, 1));
}

TEST(GetAPConfig, GivesTheDefaultsOfTheMainNetworkWithoutASection) {
    Settings here;
    WirelessAPSettings settings;
    for (const char* text : {"", "[other]\n\tenable=yes\n"}) {
        memset(&settings, 0x55, sizeof settings);
        EXPECT_EQ(TAVIWirelessGetAPConfig("Stick 2000", &settings), 0);
        ExpectMainDefaults(settings);
        EXPECT_STREQ(settings.ap.guestSsid, "");
        EXPECT_STREQ(settings.guestSchedule, "");
        EXPECT_EQ(settings.guestLanBlock + settings.ap.guestMaxStations, 0);
        WriteFile(kFile, text);
    }
    EXPECT_EQ(TAVIWirelessGetAPConfig(nullptr, &settings), -1);
    EXPECT_EQ(TAVIWirelessGetAPConfig("a", nullptr), -1);
    EXPECT_EQ(here.log.Count(" Bad parameters"), 2);
    Shell("rm " + kFile + "; mkdir " + kFile);
    EXPECT_EQ(TAVIWirelessGetAPConfig("Stick 2000", &settings), -1);
    ExpectMainDefaults(settings);
}

TEST(GetAPConfig, GivesDefaultsForMissingKeysOfASection) {
    const Settings here;
    WriteFile(kFile, "[Stick 2000]\n\tenable=no\n\tguest_net_encryption=2\n");
    const WirelessAPSettings settings = Defaults();
    ExpectMainDefaults(settings);
    EXPECT_STREQ(settings.ap.guestSsid, "HarborstackGuest");
    EXPECT_EQ(settings.guestSchedule, kFullSchedule);
    const std::vector<int32_t> numbers{settings.ap.guestMaxStations,
                                       settings.ap.guestIsolate,
                                       settings.guestLanBlock,
                                       settings.guestAllowHttp,
                                       settings.ap.guestSecret.wpa.wpaVersion,
                                       settings.ap.guestSecret.wpa.cipher};
    EXPECT_THAT(numbers, testing::ElementsAre(256, 1, 1, 1, 2, WIRELESS_AP_CCMP));
    WriteFile(kFile, "[Stick 2000]\n\tencryption=3\n\tbssid=02::\n");
    EXPECT_EQ(Defaults().ap.secret.enterprise.radiusPort, 1812);
    EXPECT_STREQ(Defaults().ap.guestBssid, "");
}

TEST(GetAPConfig, TakesWhatFitsAndComparesYesExactly) {
    Settings here;
    const std::string longText(300, 'x');
    WriteFile(kFile, "[Stick 2000]\n\tenable=YES\n\tunblock=no\n\tssid=" + longText +
                         "\n\tbridge=" + longText + "\n\twifi_sched=" + longText +
                         "\n\tchannel=11 or 12\n\tguest_net_encryption=3\n\tguest_net_wpa=1\n");
    const WirelessAPSettings settings = Defaults();
    EXPECT_EQ(settings.enabled + settings.unblock, 0);
    EXPECT_EQ(settings.ap.ssid, longText.substr(0, 127));
    EXPECT_EQ(settings.ap.bridge, longText.substr(0, 15));
    EXPECT_EQ(settings.schedule, longText.substr(0, 168));
    EXPECT_EQ(settings.ap.channel, 11);
    EXPECT_EQ(settings.ap.guestSecret.wpa.wpaVersion, 0);
    EXPECT_EQ(here.log.Count("Guest Network does not have EAP encryption"), 1);
    EXPECT_EQ(Defaults(std::string(40, 'n').c_str()).name, std::string(31, 'n'));
}

TEST(SetAPConfig, WritesEveryKeyInOrder) {
    const Settings here;
    WirelessAPSettings settings = Defaults();
    settings.enabled = 1;
    settings.ap.security = WIRELESS_AP_WPA_ENTERPRISE;
    settings.ap.secret = {};
    SetField(settings.ap.secret.enterprise.radiusAddr, "10.0.0.9");
    settings.ap.guestSecurity = WIRELESS_AP_WPA;
    SetField(settings.ap.guestSecret.wpa.passphrase, "for guests");
    SetField(settings.ap.guestBssid, "02:00:00:00:00:01");
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

TEST(SetAPConfig, SwitchingOffChangesOneLine) {
    Settings here;
    const std::string before = "# mine\n[stick 2000]\n\tssid=My Net\n\tenable=yes\n\tunblock=no\n";
    WriteFile(kFile, before);
    WirelessAPSettings settings = Defaults();
    settings.enabled = 0;
    settings.unblock = 1;
    settings.ap.security = 99;  // not looked at
    EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 1);
    std::string after = before;
    after.replace(after.find("=yes"), 4, "=no");
    EXPECT_EQ(ReadFile(kFile), after);
    SetField(settings.name, "a\nb");
    EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 0);
    EXPECT_TRUE(here.log.Has("Failed to set key[enable] of sec[a?b] in file[" + kFile + "]."));
    EXPECT_EQ(ReadFile(kFile), after);
}

TEST(SetAPConfig, RefusesWhatCannotBeStoredAndLeavesTheFile) {
    const std::string ofSection = " section: Stick 2000 from " + kFile + ", errno=0xD00";
    const struct {
        int security, guestSecurity;
        const char* ssid;
        std::string log;
        std::string section = "Stick 2000";  // that is there
    } kCases[] = {
        {0, 3, "a", "Guest Network does not have EAP encryption"},
        {4, 0, "a", "Wrong encryption"},
        {-1, 3, "a", "Wrong encryption"},
        {0, 4, "a", "Wrong encryption"},
        {0, 0, "a\n\tunblock=no", "Failed to set" + ofSection},
        {0, 0, "a\n\tunblock=no", "Failed to add" + ofSection, "other"},
    };
    for (const auto& c : kCases) {
        Settings here;
        const std::string before = "[" + c.section + "]\n\tenable=no\n";
        WriteFile(kFile, before);
        WirelessAPSettings settings = Defaults();
        settings.enabled = 1;
        settings.ap.security = c.security;
        settings.ap.guestSecurity = c.guestSecurity;
        SetField(settings.ap.ssid, c.ssid);
        EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 0);
        ASSERT_EQ(here.log.Lines().size(), 1u) << here.log.Text();
        EXPECT_THAT(here.log.Lines()[0].text,
                    AllOf(testing::StartsWith("wireless_ap_conf_set.cpp:"), EndsWith(c.log)));
        EXPECT_EQ(ReadFile(kFile), before);
    }
    Settings here;
    Shell("rm -r /usr/tavi/etc");
    const WirelessAPSettings settings = Defaults();
    EXPECT_EQ(TAVIWirelessSetAPConfig(&settings) + TAVIWirelessSetAPConfig(nullptr), 0);
    EXPECT_TRUE(here.log.Has("Failed to touch " + kFile) && here.log.Has(" Bad parameters"));
}

TEST(Settings, OfAStoreThatCannotBeLookedAtAreNotTheDefaults) {
    const Settings here;
    WirelessAPSettings settings = Defaults();
    settings.enabled = 1;
    settings.ap.security = WIRELESS_AP_WPA;
    SetField(settings.ap.secret.wpa.passphrase, "pass phrase");
    ASSERT_EQ(TAVIWirelessSetAPConfig(&settings), 1);
    const std::string stored = ReadFile(kFile);
    WriteFile("/tmp/wireless.info", "PRODUCT=Stick 2000\n");
    for (int n = 1; n <= 2; ++n) {
        gFailingStat = n;
        WirelessAPSettings read;
        EXPECT_TRUE(TAVIWirelessGetAPConfig("Stick 2000", &read) < 0 ||
                    read.ap.security == WIRELESS_AP_WPA);
        gFailingStat = n;
        EXPECT_NE(TAVIWirelessCheckBlock(), 0);
        gFailingStat = n;
        TAVIWirelessSetAPConfig(&settings);
        EXPECT_EQ(ReadFile(kFile), stored);
    }
    gFailingStat = 0;
    Shell("rm " + kFile + "; ln -s " + kFile + ' ' + kFile);  // no look at it succeeds
    WirelessAPSettings read;
    EXPECT_EQ(TAVIWirelessGetAPConfig("Stick 2000", &read), -1);
    EXPECT_EQ(TAVIWirelessCheckBlock(), -1);
    EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 0);
}

TEST(SetAPConfig, AProductNameFindsItsOwnSectionAndRunsNothing) {
    const std::string kNames[] = {
        // the last one is cut within a character
        "Stick 2000",           "WLAN.11",     "WLAN*11", "a[b]c", "$(touch /tmp/x)",
        "`touch /tmp/x`",       "a\\\\b$",     "^a|b",    "'",     "%s%n",
        "\"; touch /tmp/x; \"", "caf\xc3\xa9", "caf\xc3"};
    setenv("LC_ALL", "C.UTF-8", 1);
    Settings here;
    WriteFile(kFile, "[WLANx11]\n\tenable=yes\n[WLANNN11]\n\tenable=yes\n[ab]\n\tenable=yes\n");
    for (int round = 1; round <= 2; ++round) {  // new sections, then existing ones
        for (const std::string& name : kNames) {
            WirelessAPSettings settings = Defaults(name.c_str());
            settings.enabled = 1;
            settings.ap.channel = round;
            EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 1) << name << here.log.Text();
            EXPECT_EQ(Defaults(name.c_str()).ap.channel, round) << name;
        }
    }
    EXPECT_THAT(ReadFile(kFile),
                testing::StartsWith("[WLANx11]\n\tenable=yes\n[WLANNN11]\n\tenable="
                                    "yes\n[ab]\n\tenable=yes\n[Stick 2000]\n"));
    EXPECT_FALSE(Exists("/tmp/x"));
    unsetenv("LC_ALL");
    // The test is on "[name]" in any case, anywhere.
    ToolStandIns tools;
    Shell("mkdir -p /tmp/bin");
    tools.Add("/tmp/bin/grep", "/bin/grep \"$@\"");
    const std::string path = getenv("PATH");
    setenv("PATH", ("/tmp/bin:" + path).c_str(), 1);
    WirelessAPSettings settings = Defaults("sTICK 2000");
    settings.enabled = 1;
    settings.ap.channel = 3;
    EXPECT_EQ(TAVIWirelessSetAPConfig(&settings), 1);
    setenv("PATH", path.c_str(), 1);
    EXPECT_THAT(tools.Commands(),
                testing::ElementsAre("/tmp/bin/grep -i \\[sTICK 2000\\] " + kFile));
    EXPECT_EQ(Defaults("Stick 2000").ap.channel, 3);
}

// Random settings of the shape that is stored.
class Shaker {
  public:
    WirelessAPSettings Next() {
        WirelessAPSettings s{};
        s.enabled = 1;
        s.unblock = Below(2);
        Fill(s.name, 1);
        Fill(s.schedule);
        Fill(s.guestSchedule);
        Fill(s.ap.ssid);
        Fill(s.ap.bridge);
        Fill(s.ap.guestSsid);
        for (int32_t* number :
             {&s.txPower, &s.scheduleEnabled, &s.guestScheduleEnabled, &s.guestLanBlock,
              &s.guestAccessServer, &s.guestInternetBlock, &s.guestAllowHttp, &s.ap.hidden,
              &s.ap.band, &s.ap.ieee80211n, &s.ap.htFlags, &s.ap.channel, &s.ap.maxStations,
              &s.ap.wmm, &s.ap.guestEnabled, &s.ap.guestHidden, &s.ap.guestMaxStations,
              &s.ap.guestIsolate}) {
            *number = Number();
        }
        s.ap.security = Below(4);
        FillSecret(s.ap.security, s.ap.secret);
        s.ap.guestSecurity = Below(3);
        FillSecret(s.ap.guestSecurity, s.ap.guestSecret);
        return s;
    }

  private:
    int Below(int end) { return static_cast<int>(random_() % static_cast<unsigned>(end)); }
    int32_t Number() { return Below(4) == 0 ? static_cast<int32_t>(random_()) : Below(3); }
    // Every byte but line breaks and the end of the text.
    template <size_t kSize>
    void Fill(char (&field)[kSize], int atLeast = 0) {
        const int length = atLeast + Below(static_cast<int>(kSize) - atLeast);
        for (int i = 0; i < length; ++i) {
            const int c = Below(4) == 0 ? 1 + Below(255) : ' ' + Below(95);
            field[i] = c == '\n' || c == '\r' ? '.' : static_cast<char>(c);
        }
    }
    void FillSecret(int32_t kind, WirelessAPSecret& secret) {
        if (kind == WIRELESS_AP_WEP) {
            Fill(secret.wepKey);
        } else if (kind == WIRELESS_AP_WPA) {
            secret.wpa.wpaVersion = Number();
            secret.wpa.cipher = Number();
            Fill(secret.wpa.passphrase);
        } else if (kind == WIRELESS_AP_WPA_ENTERPRISE) {
            secret.enterprise.wpaVersion = Number();
            secret.enterprise.cipher = Number();
            secret.enterprise.radiusPort = Number();
            Fill(secret.enterprise.radiusAddr);
            Fill(secret.enterprise.radiusSecret);
        }
    }
    std::mt19937 random_{4711};
};

TEST(SetAPConfig, StoresAnySettingsSoThatTheyReadBackTheSame) {
    Settings here;
    Shaker shaker;
    for (int i = 0; i < 400; ++i) {
        if (i % 20 == 0) {
            Shell("rm -f " + kFile);
        }
        const WirelessAPSettings settings = shaker.Next();
        ASSERT_EQ(TAVIWirelessSetAPConfig(&settings), 1) << i << here.log.Text();
        WirelessAPSettings read;
        ASSERT_EQ(TAVIWirelessGetAPConfig(settings.name, &read), 1) << i;
        ASSERT_EQ(memcmp(&settings, &read, sizeof read), 0) << i << ReadFile(kFile);
    }
}

TEST(ApConfigSecNameGet, IsThePluggedProduct) {
    Settings here;
    char name[32] = "x";
    EXPECT_EQ(TAVIWirelessApConfigSecNameGet(nullptr, 32), 0);
    EXPECT_EQ(TAVIWirelessApConfigSecNameGet(name, sizeof name), 0);
    EXPECT_THAT(here.log.Lines()[0].text, AllOf(HasSubstr("wireless_ap_config_sec_name_get.cpp:"),
                                                EndsWith(" Bad parameter.")));
    EXPECT_THAT(here.log.Lines()[1].text, EndsWith(" File[/tmp/wireless.info] does not exist."));
    const std::string product = "PRODUCT=\"Stick 2000\"\n";
    for (const auto& [text, result, read] :
         {std::tuple(product, 1, "Stick 2000"), {"PRODUCT=\n", 1, ""}, {"VENDOR=x\n", 0, ""}}) {
        WriteFile("/tmp/wireless.info", text);
        EXPECT_EQ(TAVIWirelessApConfigSecNameGet(name, sizeof name), result) << text;
        EXPECT_STREQ(name, read);
    }
    WriteFile("/tmp/wireless.info", product);
    EXPECT_EQ(TAVIWirelessApConfigSecNameGet(name, 10), 0);  // too small
}

}  // namespace
}  // namespace taviwireless::test
