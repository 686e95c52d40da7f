// SPDX-License-Identifier: MIT
// taviwireless ap, end to end: the program, the library, a real interface, and the real hostapd.
#include "tests/cli/cli_runs.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

using testing::Contains;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

constexpr char kStored[] = "/usr/tavi/etc/wireless_ap.conf";
constexpr char kFlag[] = "/var/tmp/.wireless_ap_connecting";

RunResult AP(std::vector<std::string> arguments, const std::string& input = "") {
    arguments.insert(arguments.begin(), {BuiltProgram("taviwireless_with_wifi"), "ap"});
    return RunProgram(arguments, input);
}

RunResult Set(std::vector<std::string> settings, const std::string& input = "") {
    settings.insert(settings.begin(), "set");
    return AP(settings, input);
}

// An adapter that can be an access point, for which nothing is stored.
struct APCommands : testing::Test {
    APCommands() {
        Shell("rm -rf /usr/tavi/etc /etc/hostapd /etc/sysconfig /etc/dhcpd /tmp/master " +
              std::string(kFlag));
        Shell("mkdir -p /usr/tavi/etc /etc/sysconfig/network-scripts /etc/dhcpd");
        WriteFile("/etc.defaults/taviinfo.conf", "support_wireless=yes\nsupport_pci_wifi=yes\n");
        WriteFile("/tmp/wireless.info", "PRODUCT=stick\nAP_SUPPORT=yes\n");
        WriteFile("/tmp/table", "");
        tools.Add("/sbin/iwlist",
                  "[ \"$3\" != tavi ] || { printf '\\n\\n'; cat /tmp/table; exit; }\n"
                  "for channel in 1 6 11 36 40; do echo $channel; done");
        // hostapd without a radio
        WriteFile("/tmp/hostapd.conf",
                  "interface=wlan0\ndriver=none\nssid=x\nctrl_interface=/var/run/hostapd\n");
        tools.Add(
            "/etc/rc.network",
            "pkill -x hostapd; while pgrep -x hostapd > /dev/null; do sleep 0.01; done\n"
            "[ -e /etc/hostapd/hostapd-wlan0.info ] || { rm -f /tmp/master; exit 0; }\n"
            "touch /tmp/master; [ ! -e /tmp/no-network ] || { cat /tmp/no-network >&2; exit 1; }\n"
            "ip link add lbr0 type bridge 2> /dev/null\n"
            "hostapd -B /tmp/hostapd.conf > /dev/null");
    }
    ~APCommands() override {
        Shell("pkill -x hostapd; rm -f /tmp/no-network /tmp/master /tmp/wireless.info");
        RunProgram({"ip", "link", "delete", "lbr0"});
    }
    ToolStandIns tools;
    WirelessInterface interface;
};

TEST_F(APCommands, SettingsAreInTheWordsOfAPerson) {
    const RunResult set = Set(
        {"ssid=Our Home", "security=wpa2", "key", "cipher=both", "band=5", "channel=64", "width=40",
         "hidden=yes", "max-stations=20", "bridge=lbr1", "guest=yes", "guest-ssid=Visitors",
         "guest-security=wep", "guest-key", "guest-isolate=no", "country=de"},
        "the phrase\n0123456789\n");
    ASSERT_EQ(set.status, 0) << set.err;
    EXPECT_EQ(FileMode(kStored), 0600u);
    EXPECT_EQ(AP({"show"}).out,
              "Adapter                   stick\n"
              "To be on                  no\n"
              "Network                   Our Home\n"
              "Hidden                    yes\n"
              "Stations at most          20\n"
              "Security                  wpa2, cipher both\n"
              "Key                       ********\n"
              "Bridge                    lbr1\n"
              "Country                   DE\n"
              "Mode                      802.11an at 5 GHz\n"
              "Channel                   64, 40 MHz\n"
              "Guest network             yes\n"
              "Guests: Network           Visitors\n"
              "Guests: Hidden            no\n"
              "Guests: Stations at most  256\n"
              "Guests: Security          wep\n"
              "Guests: Key               ********\n"
              "Guests: Isolated          no\n");
    const Json::Value shown = Parse(AP({"show", "--show-secrets", "--json"}).out);
    EXPECT_EQ(shown["key"], "the phrase");
    EXPECT_EQ(shown["guest"]["key"], "0123456789");
    EXPECT_EQ(shown["mode"], "an");
    EXPECT_EQ(Parse(AP({"show", "--json"}).out)["key"], "********");
}

TEST_F(APCommands, WhatIsNotSetKeepsItsDefaultOrItsStoredValue) {
    ASSERT_EQ(Set({"ssid=First", "security=open", "mode=an", "channel=149", "width=20"}).status, 0);
    EXPECT_THAT(ReadFile(kStored), HasSubstr("\tguest_net_lan_block=1\n"));
    EXPECT_THAT(ReadFile(kStored), HasSubstr("\tenable=no\n"));
    Shell(
        "sed -i 's/guest_net_lan_block=1/guest_net_lan_block=0/; s/enable=no/enable=yes/;"
        "s/bssid=$/bssid=02:00:00:00:00:01/; s/txpower=10/txpower=7/' " +
        std::string(kStored));
    ASSERT_EQ(Set({"security=wpa-eap", "radius-server=10.0.0.9", "radius-secret"}, "s\n").status,
              0);
    for (const char* line : {"enable=yes", "ssid=First", "txpower=7", "bssid=02:00:00:00:00:01",
                             "guest_net_lan_block=0", "auth_server_port=1812"}) {
        EXPECT_THAT(ReadFile(kStored), HasSubstr("\t" + std::string(line) + "\n"));
    }
    // Another version of WPA keeps the key, another kind of security does not.
    ASSERT_EQ(Set({"security=wpa", "key"}, "the phrase\n").status, 0);
    EXPECT_EQ(Set({"security=wpa-mixed"}).status, 0);
    EXPECT_EQ(Set({"security=wep"}).err, "taviwireless: security wep needs key\n");
}

TEST_F(APCommands, AWrongSettingChangesNothing) {
    const struct {
        std::vector<std::string> settings;
        std::string input, sentence;
    } kCases[] = {
        {{"colour=red"},
         "",
         "an access point has no setting colour; taviwireless ap set --help lists"},
        {{"ssid"}, "", "ssid needs a value: ssid=VALUE"},
        {{"ssid=" + std::string(33, 's')}, "", "the name of a network has 1 to 32 bytes"},
        {{"ssid=a", "ssid=b"}, "", "ssid is given twice"},
        {{"hidden=maybe"}, "", "hidden is yes or no"},
        {{"max-stations=0"}, "", "max-stations is a number from 1 to 2007"},
        {{"bridge=#"}, "", "bridge is the name of an interface"},
        {{"bridge=gbr"}, "", "bridge cannot be gbr, an interface that is no bridge of the main"},
        {{"ssid=a\rb"}, "", "the name of a network may not hold a line break"},
        {{"key=geheim77"}, "", "key is read from standard input, where nobody"},
        {{"security=wpa3"}, "", "security cannot be wpa3; it is one of open, wep, wpa, wpa2, "},
        {{"guest-security=wpa-eap"}, "", "security cannot be wpa-eap; it is one of open, wep"},
        {{"security=wpa2"}, "", "security wpa2 needs key"},
        {{"security=open", "guest=yes", "guest-security=wpa2"},
         "",
         "guest-security wpa2 needs guest-key"},
        {{"security=wpa2", "key"}, std::string(64, 'p') + "\n", "a WPA key has 8 to 63"},
        {{"key"}, "12345678\n", "a key needs the security wep, wpa, wpa2 or wpa-mixed"},
        {{"ssid=a"}, "", "security is not set: add security=wpa2 key, or security=open for a "},
        {{"security=open", "guest=yes"}, "", "guest-security is not set: add guest-security=wpa2 "},
        {{"country=Germany"}, "", "country has two letters, such as DE or US, or is none"},
        {{"cipher=aes"}, "", "a cipher needs one of the kinds of security with wpa"},
        {{"security=wpa-eap", "radius-server=home"}, "", "radius-server is an IPv4 address"},
        {{"mode=g"}, "", "mode cannot be g; it is one of b, bg, bgn, n, a, an"},
        {{"band=5", "mode=bgn"}, "", "mode bgn is of the band 2.4, not 5"},
        {{"security=open", "channel=14"}, "", "there is no channel 14 at 2.4 GHz in this mode"},
        {{"security=open", "band=5", "channel=6"},
         "",
         "there is no channel 6 at 5 GHz; channel is auto, 36 to 64"},
        {{"security=open", "band=5", "channel=149"},
         "",
         "channel 149 has no room for 40 MHz at 5 GHz; "},
        {{"width=40", "mode=bg"}, "", "40 MHz need mode bgn, n or an"},
        {{"width=80"}, "", "width is 20 or 40 (MHz)"},
        {{"mode=n", "security=wpa", "cipher=tkip", "key"}, "12345678\n", "mode n carries "},
    };
    for (const auto& wrong : kCases) {
        SCOPED_TRACE(wrong.sentence);
        const RunResult set = Set(wrong.settings, wrong.input);
        EXPECT_EQ(set.status, kUsage);
        EXPECT_THAT(set.err, StartsWith("taviwireless: " + wrong.sentence));
    }
    EXPECT_EQ(Parse(AP({"set", "width=80", "--json"}).out)["error"], "width is 20 or 40 (MHz)");
    EXPECT_FALSE(Exists(kStored));
}

TEST_F(APCommands, ACheckShowsTheFilesWithoutSecretsAndSwitchesNothing) {
    interface.Up();
    ASSERT_EQ(Set({"security=wpa2", "mode=b", "channel=14", "key"}, "the phrase\n").status, 0);
    const RunResult check = AP({"check"});
    EXPECT_THAT(check.out, StartsWith("# /etc/hostapd/hostapd-wlan0-host.conf\ninterface=wlan0\n"));
    EXPECT_THAT(check.out, HasSubstr("\nwpa_passphrase=********\n"));
    EXPECT_THAT(check.out + check.err, Not(HasSubstr("the phrase")));
    EXPECT_THAT(AP({"check", "--show-secrets"}).out, HasSubstr("wpa_passphrase=the phrase\n"));
    const Json::Value document = Parse(AP({"check", "--json"}).out);
    EXPECT_THAT(document["files"]["/etc/hostapd/hostapd-wlan0-host.conf"].asString(),
                HasSubstr("\nwpa_passphrase=********\n"));
    EXPECT_FALSE(Exists("/etc/hostapd"));
    EXPECT_THAT(Shell("ip link show wlan0"), HasSubstr(",UP"));
}

TEST_F(APCommands, ACheckNamesWhatHostapdRefusesAndIncludesTheGuestsWhereTheModelHasThem) {
    const std::string guests = "# /etc/hostapd/hostapd-wlan0-guest.conf\nbss=gwlan\n";
    ASSERT_EQ(
        Set({"security=open", "guest=yes", "guest-security=open", "mode=a", "channel=165"}).status,
        0);
    EXPECT_THAT(AP({"check"}).out, HasSubstr(guests));
    SetSupport("yes");
    EXPECT_THAT(AP({"check"}).out, Not(HasSubstr(guests)));
    Shell("sed -i 's/max_num_sta=256/max_num_sta=3000/' " + std::string(kStored));
    const RunResult check = AP({"check"});
    EXPECT_EQ(check.status, kFailure);
    EXPECT_THAT(check.err, StartsWith("taviwireless: hostapd would not start: Line "));
    EXPECT_THAT(check.err, HasSubstr("Invalid max_num_sta=3000; allowed range 0..2007"));
    EXPECT_THAT(check.err, Not(HasSubstr("taviwireless_only_checks")));
    EXPECT_THAT(Parse(AP({"check", "--json"}).out)["error"].asString(), HasSubstr("max_num_sta"));
}

TEST_F(APCommands, ItIsSwitchedOnAndOff) {
    ASSERT_EQ(Set({"security=open"}).status, 0);
    EXPECT_EQ(AP({"enable"}).out,
              "wlan0: access point Merilond switched on, open: everybody can join\n");
    EXPECT_THAT(tools.Commands(), Contains("/etc/rc.network restart wlan0 lbr0"));
    EXPECT_THAT(ReadFile("/etc/hostapd/hostapd-wlan0-host.conf"), HasSubstr("ssid=Merilond\n"));
    Shell("ip address add 10.1.14.1/24 dev lbr0; ip link set lbr0 up");
    EXPECT_EQ(AP({"enable"}).out,
              "wlan0: access point Merilond is on already, open: everybody can join\n");
    ASSERT_EQ(Set({"ssid=New"}).status, 0);
    EXPECT_THAT(AP({"enable"}).out, StartsWith("wlan0: access point New switched on, "));
    const Json::Value on = Parse(AP({"status", "--json"}).out);
    EXPECT_TRUE(on["state"] == "on" && on["enabled"] == true) << on;
    EXPECT_EQ(on["bridge"], "lbr0");
    EXPECT_EQ(on["address"], "10.1.14.1");
    EXPECT_EQ(on["max_stations"], 256);
    const RunResult off = AP({"disable"});
    EXPECT_EQ(off.out, "wlan0: access point switched off\n") << off.err;
    EXPECT_THAT(ReadFile(kStored), HasSubstr("\tenable=no\n"));
    EXPECT_EQ(AP({"disable"}).out, "wlan0: access point is off already\n");
    ASSERT_EQ(AP({"enable"}).status, 0);
    Shell("rm /tmp/wireless.info");  // the adapter is unplugged
    EXPECT_EQ(AP({"disable"}).status, 0);
    EXPECT_FALSE(Exists("/etc/hostapd/hostapd-wlan0.info"));
}

TEST_F(APCommands, WithoutStoredSettingsOfItsOwnItIsNotSwitchedOn) {
    for (const char* stored : {"[other]\n\tenable=yes\n", "[stick]\n\tenable=no\n"}) {
        WriteFile(kStored, stored);
        for (const char* option : {"--verbose", "--dry-run"}) {
            EXPECT_THAT(AP({"enable", option}).err,
                        HasSubstr("taviwireless: no settings are stored for the adapter stick; "
                                  "taviwireless ap set stores them, and --open serves "));
        }
        EXPECT_EQ(ReadFile(kStored), stored);
    }
    for (const char* line : {"bridge=eth0", "encryption=9"}) {
        WriteFile(kStored, "[stick]\n\tenable=no\n\t" + std::string(line) + "\n\tencryption=0\n");
        EXPECT_EQ(AP({"enable"}).status, kFailure) << line;
    }
    EXPECT_FALSE(Exists("/etc/hostapd"));
    WriteFile(kStored, "");
    EXPECT_THAT(AP({"enable", "--open"}).out, HasSubstr(" Merilond switched on, open: everybody "));
    ASSERT_EQ(Set({"security=wpa2", "key"}, "12345678\n").status, 0);
    EXPECT_THAT(AP({"enable", "--open"}).err, HasSubstr("and security wpa2 is stored; leave it "));
}

TEST_F(APCommands, AStoreThatCannotBeLookedAtServesNoOpenNetwork) {
    const std::string stored = kStored;
    Shell("ln -s " + stored + ' ' + stored);
    EXPECT_EQ(AP({"enable"}).err, "taviwireless: cannot read the settings in " + stored + "\n");
    EXPECT_EQ(Set({"ssid=Merilond"}).status, kFailure);
    EXPECT_FALSE(Exists("/etc/hostapd"));
}

TEST_F(APCommands, AFailedStartSaysWhyAndLeavesItOff) {
    const struct {
        const char *arrange, *undo, *cause;
    } kCases[] = {
        {"touch /tmp/no-network", "rm /tmp/no-network",
         "the system log tells why, and --verbose shows it"},
        {"echo 'rc.network: lbr0 is taken' > /tmp/no-network", "rm /tmp/no-network",
         "lbr0 is taken"},
        {"printf 'Configuration file: x\\nwlan0: interface state A->B\\nnl80211: no mode AP\\n"
         "wlan0: AP-DISABLED\\nrc.network: cannot start hostapd on wlan0; its messages above say "
         "why\\n' > /tmp/no-network",
         "rm /tmp/no-network", "cannot start hostapd on wlan0: nl80211: no mode AP"},
        {"mount --bind /etc /etc; mount -o remount,bind,ro /etc", "umount /etc",
         "/etc cannot be written: Read-only file system"},
        {"chmod a-x /usr/sbin/iwlist", "chmod a+x /usr/sbin/iwlist",
         "there is no program iwlist to ask for channels; install it"},
        {"mv /usr/sbin/iwlist /tmp; ln -s /bin/true /usr/sbin/iwlist", "mv /tmp/iwlist /usr/sbin",
         "the adapter offers no channel; is its radio switched off? (rfkill list)"},
    };
    ASSERT_EQ(Set({"ssid=Home", "security=open"}).status, 0);
    const std::string stored = ReadFile(kStored);
    for (const auto& failure : kCases) {
        Shell(failure.arrange);
        const RunResult enable = AP({"enable"});
        Shell(failure.undo);
        EXPECT_THAT(
            enable.err,
            testing::EndsWith("could not be switched on: " + std::string(failure.cause) + "\n"));
        EXPECT_EQ(ReadFile(kStored), stored);
        EXPECT_FALSE(Exists("/tmp/master") || Exists("/etc/hostapd/hostapd-wlan0.info"));
        EXPECT_EQ(AP({"enable"}).status, 0);
        EXPECT_EQ(AP({"disable"}).status, 0);
    }
}

// ap set channel=auto, at 2.4 and 5 GHz.
TEST_F(APCommands, TheEmptiestChannelIsChosenAndWhyIsSaid) {
    const struct {
        std::vector<std::pair<int, int>> networks;  // channel, signal
        const char *band, *width, *choice;
    } kCases[] = {
        {{}, "band=2.4", "width=40", "channel 1: no networks"},
        {{{1, 50}, {6, 60}, {11, 40}},
         "band=2.4",
         "width=20",
         "channel 11: 1 network, weaker than those of 1 and 6"},
        {{{3, 50}, {149, 90}}, "band=2.4", "width=40", "channel 11: no networks; 1 has 1, 6 has 1"},
        {{{1, 9}, {4, 9}, {11, 5}},
         "band=2.4",
         "width=40",
         "channel 11: 1 network, weaker than that of 6; 1 has 2"},
        {{{36, 5}, {1, 90}}, "band=5", "width=20", "channel 40: no networks; 36 has 1"},
        {{{36, 5}}, "band=5", "width=40", "channel 36: 1 network"},
    };
    ASSERT_EQ(Set({"security=open"}).status, 0);
    for (const auto& row : kCases) {
        std::string table;
        for (const auto& [channel, signal] : row.networks) {
            table += ScanLine(channel, "A", "00:11:22:33:44:55", signal, "11b/g/n", "NONE");
        }
        WriteFile("/tmp/table", table);
        EXPECT_EQ(AP({"set", "channel=auto", row.band, row.width}).out,
                  "Stored, " + std::string(row.choice) +
                      "; taviwireless ap enable puts it into force.\n");
    }
    EXPECT_THAT(ReadFile(kStored), HasSubstr("\tchannel=36\n"));
    tools.Add("/sbin/iwlist", "exit 1");
    const Json::Value blind = Parse(AP({"set", "channel=auto", "--json"}).out);
    EXPECT_THAT(blind["remark"].asString(), StartsWith("hostapd chooses the channel: "));
    EXPECT_TRUE(blind["channel"].isNull());
}

TEST_F(APCommands, ACountryIsToldToTheKernelAndMissedWhereItIsNotInForce) {
    tools.Add("/usr/sbin/iw", "[ $2 = get ] && cat /tmp/country || cp /tmp/next /tmp/country");
    WriteFile("/tmp/country", "global\ncountry 00: DFS-UNSET\n");
    WriteFile("/tmp/next", "global\ncountry DE: DFS-ETSI\n");
    ASSERT_EQ(Set({"country=de", "security=open", "channel=1"}).status, 0);
    EXPECT_TRUE(Parse(AP({"enable", "--json"}).out)["remark"].isNull());
    EXPECT_THAT(tools.Commands(), Contains("/usr/sbin/iw reg set DE"));
    ASSERT_EQ(Set({"country=US", "channel=2"}).status, 0);
    EXPECT_THAT(AP({"enable"}).out,
                HasSubstr("; country US is not in force: the kernel keeps the rules of DE; "));
    ASSERT_EQ(Set({"country=none"}).status, 0);
    EXPECT_TRUE(Parse(AP({"show", "--json"}).out)["country"].isNull());
}

TEST_F(APCommands, StationsAreThoseThatHostapdLetIn) {
    EXPECT_THAT(AP({"stations"}).err, StartsWith("taviwireless: no access point is on: "));
    ASSERT_EQ(Set({"security=open", "ssid=Home"}).status, 0);
    ASSERT_EQ(AP({"enable"}).status, 0);
    EXPECT_EQ(AP({"stations"}).out, "Nobody is connected.\n");
    Shell(
        "hostapd_cli -i wlan0 new_sta 02:00:00:00:00:05 > /dev/null\n"
        "ip address add 10.1.14.1/24 dev lbr0; ip link set lbr0 up\n"
        "ip neighbour add 10.1.14.7 lladdr 02:00:00:00:00:05 dev lbr0 nud permanent");
    EXPECT_EQ(AP({"stations"}).out,
              "STATION            NAME  ADDRESS    SIGNAL  SINCE  NETWORK\n"
              "02:00:00:00:00:05  -     10.1.14.7  -       -      Home\n");
    // As from a radio, and as BusyBox's server writes a lease down.
    tools.Add("/usr/sbin/hostapd_cli",
              "[ $5 = all_sta ] || { echo PONG; exit; }\n"
              "printf '02:00:00:00:00:06\\nflags=[AUTH][ASSOC][AUTHORIZED]\\nrx_bytes=10\\n"
              "signal=-60\\nconnected_time=100\\n02:00:00:00:00:07\\nflags=[AUTH]\\n'");
    const std::string lease =
        std::string("\xFF\xFF\xFF\xFF\x0A\x01\x0E\x09\x02\0\0\0\0\x06phone", 19);
    WriteFile("/etc/dhcpd/dhcpd-lbr0-lbr0.leases",
              std::string(8, '\0') + lease + std::string(17, '\0'));
    const Json::Value stations = Parse(AP({"stations", "--json"}).out);
    ASSERT_EQ(stations.size(), 1u) << stations;
    EXPECT_EQ(stations[0]["mac"], "02:00:00:00:00:06");
    EXPECT_EQ(stations[0]["address"], "10.1.14.9");
    EXPECT_EQ(stations[0]["name"], "phone");
    EXPECT_EQ(stations[0]["signal"], 80);
    EXPECT_NEAR(stations[0]["connected_since"].asDouble(), static_cast<double>(time(nullptr)) - 100,
                60);
    EXPECT_TRUE(stations[0]["bytes_sent"].isNull());
}

// The picture is the one that another program draws.
TEST_F(APCommands, AHotspotHasAKeyToTypeAndACodeToScan) {
    const auto draw = [](const char* letters, std::vector<std::string> command) {
        command.insert(command.begin(), {"env", std::string("LC_ALL=") + letters,
                                         BuiltProgram("taviwireless_with_wifi"), "ap"});
        return RunProgram(command).out;
    };
    const Json::Value made = Parse(AP({"hotspot", R"(A;b"c,d:e\f)", "--json"}).out);
    const std::string key = made["key"].asString();
    EXPECT_THAT(key, testing::MatchesRegex("([acdefhjkmnprtwxy]{4}-){3}[acdefhjkmnprtwxy]{4}"));
    const std::string text = R"(WIFI:T:WPA;S:A\;b\"c\,d\:e\\f;P:)" + key + ";;";
    EXPECT_EQ(made["qr_text"], text);
    for (const auto& [letters, type] : {std::pair{"C", "ASCII"}, {"C.UTF-8", "UTF8"}}) {
        const std::string drawn =
            RunProgram({"qrencode", "-8", "-l", "L", "-m", "4", "-t", type, text}).out;
        const auto trim = [](const std::string& picture) {
            return RunProgram({"sed", "s/ *$//"}, picture).out;
        };
        EXPECT_TRUE(trim(draw(letters, {"qr"})) == trim(drawn)) << type;
    }
    const auto onTerminal = [](const char* columns) {
        return RunProgram({"script", "-qec",
                           "stty cols " + std::string(columns) + "; TERM=xterm '" +
                               BuiltProgram("taviwireless_with_wifi") + "' ap qr",
                           "/dev/null"})
            .out;
    };
    EXPECT_THAT(onTerminal("100"), HasSubstr("\033[40;97m"));
    EXPECT_THAT(onTerminal("20"), HasSubstr(" columns, and the terminal has 20; --json shows "));
    const RunResult again = AP({"hotspot"});
    EXPECT_THAT(again.out, HasSubstr(" is on already, security wpa2\n"));
    EXPECT_THAT(again.out, HasSubstr("Key      " + key + "\n"));
    ASSERT_EQ(Set({"security=open", "ssid=Cafe", "hidden=yes"}).status, 0);
    EXPECT_EQ(Parse(AP({"qr", "--json"}).out)["qr_text"], "WIFI:T:nopass;S:Cafe;H:true;;");
    EXPECT_NE(Parse(AP({"hotspot", "Cafe", "--json"}).out)["key"], key);
    EXPECT_EQ(AP({"qr", "--guest"}).status, kFailure);
}

TEST_F(APCommands, ADryRunShowsThePlanAndSwitchesNothing) {
    const std::string files = "/etc/sysconfig/network-scripts/ifcfg-lbr0";
    const std::pair<std::string, const char*> kRows[] = {
        {"true", "wlan0 lbr0 no  10.1.14.1/24 yes"},
        {"printf 'LOCAL_LAN=yes\nIPADDR=10.1.14.1\n' > " + files +
             "; echo enable=no > /etc/dhcpd/dhcpd-lbr0-lbr0.info",
         "wlan0 lbr0 no   no"},
        {"sed -i s/bridge=lbr0/bridge=br0/ " + std::string(kStored), "wlan0 br0 no eth0  no"},
    };
    ASSERT_EQ(Set({"ssid=Home", "security=open"}).status, 0);
    tools.Add("/etc/rc.network", "echo 'bridge  is made'; exit $(cat /tmp/status)");
    WriteFile("/tmp/status", "0");
    for (const auto& [arrange, words] : kRows) {
        Shell(arrange);
        tools.ForgetCommands();
        EXPECT_EQ(AP({"enable", "--dry-run"}).out, "bridge  is made\n");
        EXPECT_THAT(tools.Commands(),
                    testing::ElementsAre("/etc/rc.network --dry-run enable " + std::string(words)));
    }
    WriteFile("/tmp/status", "1");
    EXPECT_EQ(AP({"enable", "--dry-run"}).err,
              "taviwireless: the access point cannot be switched on: bridge  is made\n");
    EXPECT_FALSE(Exists("/etc/hostapd/hostapd-wlan0.info"));
}

// When the machine starts.
TEST_F(APCommands, WhatWasSwitchedOnIsOnAgainAfterARestart) {
    const std::string program = "/usr/bin/taviwireless";
    tools.Add(program, "[ \"$*\" = 'wifi auto' ] || exec '" +
                           BuiltProgram("taviwireless_with_wifi") + "' \"$@\"");
    tools.Add("/usr/tavi/hotplug/usb.plug");
    const std::vector<std::string> boot = {"sh",
                                           TAVI_SOURCE_DIR "/platform/host_root/start-wireless"};
    const std::string restart = "/etc/rc.network restart wlan0 lbr0";
    for (const char* enabled : {"no", "yes"}) {
        ASSERT_EQ(Set({"ssid=Home", "security=open"}).status, 0);
        Shell("sed -i s/enable=no/enable=" + std::string(enabled) + "/ " + kStored);
        tools.ForgetCommands();
        WriteFile(kFlag, "");  // the power failed in an attempt
        const RunResult result = RunProgram(boot);
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(tools.Commands().front(), "/usr/tavi/hotplug/usb.plug ");
        EXPECT_EQ(testing::Matches(Contains(restart))(tools.Commands()),
                  enabled == std::string("yes"));
    }
    WriteFile("/tmp/no-network", "");
    Shell("pkill -x hostapd; while pgrep -x hostapd > /dev/null; do sleep 0.01; done");
    EXPECT_EQ(RunProgram(boot).status, 1);
    WriteFile("/usr/tavi/etc/wireless.conf", "[Home_00:11:22:33:44:55]\n\tessid=Home\n");
    EXPECT_EQ(RunProgram(boot).status, 1);
    EXPECT_THAT(tools.Commands(), Not(Contains(program + " wifi auto")));
    Shell("sed -i s/enable=yes/enable=no/ " + std::string(kStored));
    EXPECT_EQ(RunProgram(boot).status, 0);
    EXPECT_THAT(tools.Commands(), Contains(program + " wifi auto"));
}

TEST_F(APCommands, WhatIsMissingIsSaidInOneLine) {
    const auto asNobody = [](const char* command) {
        return RunAsNobody({BuiltProgram("taviwireless_with_wifi"), "ap", command});
    };
    ASSERT_EQ(Set({"ssid=Home", "security=open"}).status, 0);
    for (const char* command : {"show", "check", "enable", "disable"}) {
        EXPECT_THAT(asNobody(command).err, HasSubstr("needs root; try sudo taviwireless ap "));
    }
    ASSERT_EQ(chmod(kStored, 0), 0);  // also where there is no other user to hide it from
    const RunResult status = asNobody("status");
    EXPECT_EQ(status.out, "Interface  wlan0\nState      off\n") << status.err;
    WriteFile("/tmp/wireless.info", "PRODUCT=stick\nAP_SUPPORT=no\n");
    EXPECT_THAT(AP({"enable"}).err, StartsWith("taviwireless: there is no adapter that can be an"));
    Shell("rm /tmp/wireless.info");
    EXPECT_THAT(AP({"show"}).err, StartsWith("taviwireless: there are no settings without an"));
    EXPECT_EQ(Parse(AP({"status", "--json"}).out)["state"], "not_supported");
}

}  // namespace
}  // namespace taviwireless::test
