// SPDX-License-Identifier: MIT
// The file of saved networks, the gateway that a connection should use, and joining the network
// that was used last.
#include <ctime>

#include "tests/support/sleep_capture.h"
#include "tests/wireless/station_fixture.h"
#include "wireless/system/queue.h"

namespace taviwireless::test {
namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;

constexpr char kSection[] = "00:11:22:AA:BB:CC";

// The essids of the listed networks; frees them.
std::vector<std::string> Essids(int (*list)(WirelessLink*), int expectedResult = 0) {
    wireless::OwnedList<WirelessConf> confs;
    EXPECT_EQ(list(confs.Head()), expectedResult);
    std::vector<std::string> essids;
    for (const WirelessConf& conf : confs) {
        essids.emplace_back(conf.network.essid);
    }
    return essids;
}

WirelessConf Saved() {
    WirelessConf conf;
    EXPECT_EQ(TAVIWirelessConfGet(kSection, &conf), 0);
    return conf;
}

TEST(Saving, WritesASectionThatOnlyTheOwnerCanRead) {
    Station station;
    const WirelessConf conf = MakeConf(" a#b;\"%s$(", "[a secret]='\\ ");
    const time_t before = time(nullptr);
    EXPECT_EQ(TAVIWirelessConfSet(&conf), 0);
    const int accessTime = Saved().accessTime;
    EXPECT_TRUE(accessTime >= before && accessTime <= time(nullptr)) << accessTime;
    EXPECT_EQ(ReadFile(kSavedFile),
              "[00:11:22:AA:BB:CC]\n\tKEY=[a secret]='\\ \n\tIPADDR=DHCP\n\tNETMASK=\n\tGATEWAY=\n"
              "\tESSID= a#b;\"%s$(\n\tBSSID=00:11:22:AA:BB:CC\n\tMODE=Managed\n\tACCESS_TIME=" +
                  std::to_string(accessTime) + "\n\tAUTH=WPA2PSK\n\tENCRYPT=AES\n");
    EXPECT_EQ(FileMode(kSavedFile), 0600u);
    EXPECT_STREQ(Saved().network.essid, conf.network.essid);
    EXPECT_STREQ(Saved().key, conf.key);
    EXPECT_EQ(station.log.Text(), "");
}

TEST(Reading, MissingKeysAreEmptyAndLongValuesCut) {
    Station station;
    WirelessConf conf;
    EXPECT_EQ(TAVIWirelessConfGet("other", &conf), -1);
    EXPECT_TRUE(station.log.Has("Configuration /usr/tavi/etc/wireless.conf doen't exist"));
    WriteFile(kSavedFile, "[no address]\n\tESSID=" + std::string(100, 'e') + "\n\tIPADDR=" +
                              std::string(100, '1') + "\n\tACCESS_TIME=4294967297\n");
    memset(&conf, 0x55, sizeof conf);
    EXPECT_EQ(TAVIWirelessConfGet("no address", &conf), 0);
    EXPECT_EQ(conf.network.essid, std::string(32, 'e'));
    EXPECT_EQ(conf.ipAddr, std::string(19, '1'));
    EXPECT_EQ(conf.accessTime, 1);
    EXPECT_EQ(conf.key + std::string(conf.user), "");
    EXPECT_EQ(conf.network.auth + conf.network.encrypt + conf.network.bssid[0], 0);
    EXPECT_EQ(conf.network.opmode, WIRELESS_OPMODE_UNKNOWN);
    EXPECT_EQ(TAVIWirelessConfGet("other", &conf), -1);
    EXPECT_TRUE(
        station.log.Has("Not found or failed to get section: /usr/tavi/etc/wireless.conf "));
}

TEST(Listing, IsInTheOrderOfTheFileOrTheLastUsedFirst) {
    Station station;
    std::string text;
    const std::pair<const char*, int> kNetworks[] = {{"a", 100}, {"b", 300}, {"c", 200},
                                                     {"d", 300}, {"e", -5},  {"f", 100}};
    for (const auto& [essid, time] : kNetworks) {
        text += std::string("[02:00:00:00:00:0") + essid + "]\n\tESSID=" + essid +
                "\n\tACCESS_TIME=" + std::to_string(time) + "\n";
    }
    WriteFile(kSavedFile, text);
    EXPECT_THAT(Essids(TAVIWirelessConfEnum), ElementsAre("a", "b", "c", "d", "e", "f"));
    EXPECT_THAT(Essids(TAVIWirelessConfEnumByAtime), ElementsAre("b", "d", "c", "a", "f", "e"));
    std::filesystem::remove(kSavedFile);
    EXPECT_THAT(Essids(TAVIWirelessConfEnum, -1), ElementsAre());
    EXPECT_EQ(TAVIWirelessConfEnumByAtime(nullptr), -1);
    EXPECT_TRUE(station.log.Has("Failed to enumerate sections in '/usr/tavi/etc/wireless.conf'"));
    EXPECT_TRUE(station.log.Has(" Bad parameters"));
}

TEST(Gateway, IsThatOfTheLeaseOrElseThatOfTheSavedNetwork) {
    Station station;
    SetSupport("yes");
    char gateway[20];
    const auto get = TAVIWirelessDefaultGatewayConfGet_core;
    EXPECT_EQ(get(nullptr, 20) + get(gateway, 0) + get(gateway, sizeof gateway), -3);
    EXPECT_TRUE(station.log.Has("Failed to get configuration of 00:00:00:00:00:00"));

    station.driver.accessPoint = {0, 1};
    WriteFile(kRecord, "My Net\n0\n5\n8\n00:11:22:AA:BB:CC\n");
    WirelessConf conf = MakeConf();
    strcpy(conf.gateway, "10.0.0.1");
    EXPECT_EQ(TAVIWirelessConfSet(&conf), 0);
    EXPECT_EQ(get(gateway, sizeof gateway), 0);
    EXPECT_STREQ(gateway, "10.0.0.1");
    EXPECT_EQ(get(gateway, 5), 0);
    EXPECT_STREQ(gateway, "10.0");

    Shell("cp /bin/sleep /tmp/udhcpc");
    Process client({"/tmp/udhcpc", "1000"});
    WriteFile("/etc/dhcpc/dhcpcd-wlan0.pid", std::to_string(client.Pid()));
    EXPECT_EQ(get(gateway, sizeof gateway), 0);
    EXPECT_STREQ(gateway, "");
    WriteFile("/etc/dhcpc/dhcpcd-wlan0.info", "IPADDR=10.1.1.2\nGATEWAY=10.1.1.1\n");
    EXPECT_EQ(get(gateway, sizeof gateway), 0);
    EXPECT_STREQ(gateway, "10.1.1.1");
}

// Networks "old", "new" and "middle" are saved, and whoever waits finds itself associated after.
// The supplicant notes each network in /tmp/tried, and joins the one of this name.
struct RoamingStation : Station {
    explicit RoamingStation(const std::string& joinable) {
        const std::pair<const char*, int> kNetworks[] = {{"old", 1}, {"new", 3}, {"middle", 2}};
        for (const auto& [essid, time] : kNetworks) {
            const std::string digit = std::to_string(time);
            saved += "[02:00:00:00:00:0" + digit + "]\n\tESSID=" + essid + "\n\tKEY=" + kKey +
                     "\n\tACCESS_TIME=" + digit + "\n\tMODE=Managed\n\tIPADDR=10.0.0." + digit +
                     "\n\tNETMASK=255.255.255.0\n\tAUTH=WPA2PSK\n\tENCRYPT=AES\n";
        }
        WriteFile(kSavedFile, saved);
        tools.Add("/usr/sbin/wpa_supplicant",
                  "sed -n 's/.*ssid=\"\\(.*\\)\"/\\1/p' " + std::string(kSupplicantFile) +
                      " >> /tmp/tried\ngrep -q 'ssid=\"" + joinable + "\"' " + kSupplicantFile +
                      " && echo wpa_state=COMPLETED > /tmp/state\ntouch /tmp/started");
        tools.Add("/usr/sbin/wpa_cli",
                  "[ $1 = status ] || exec rm -f /tmp/state /tmp/started\n"
                  "until [ -e /tmp/started ]; do sleep 0.01; done; cat /tmp/state 2> /dev/null");
        Shell("rm /tmp/state");
        // An access point that nobody asked for, so that scans are not empty.
        Scan(ScanLine(1, "neighbour", "02:00:00:00:00:99", 50, "11b/g", "NONE"));
    }

    void Scan(const std::string& table) { AddScanner(tools, {table}); }
    std::string Tried() const { return Exists("/tmp/tried") ? ReadFile("/tmp/tried") : ""; }
    bool Disconnected() const {
        return testing::Value(tools.Commands(), Contains("/sbin/iwconfig wlan0 essid off"));
    }
    // Each look at the networks in range takes two runs of the tool that say the same.
    int Lookups() const {
        const auto commands = tools.Commands();
        return static_cast<int>(std::count(commands.begin(), commands.end(),
                                           "/sbin/iwlist wlan0 scanning tavi")) /
               2;
    }

    std::string saved;
    SleepCapture sleeps{[this](unsigned) { driver.accessPoint = {2}; }};
};

std::string Addresses() {
    return Shell("ip -4 -o address show wlan0");
}

TEST(AutoConnect, TakesTheSettingsOfANetworkInRangeFromTheScan) {
    RoamingStation station("renamed");
    station.Scan(ScanLine(6, "renamed", "02:00:00:00:00:03", 70, "11b/g/n", "WPAPSK/TKIP"));
    EXPECT_EQ(TAVIWirelessAutoConnect(), 0);
    EXPECT_EQ(station.Tried(), "renamed\n");
    EXPECT_EQ(station.Lookups(), 1);
    EXPECT_THAT(ReadFile(kSupplicantFile), HasSubstr("\tpairwise=TKIP\n\tpsk=\"a secret\""));
    EXPECT_THAT(Addresses(), HasSubstr("10.0.0.3/24"));
    EXPECT_FALSE(station.Disconnected());
}

// Of one of unknown kind that is not in range, once.
TEST(AutoConnect, TriesTheLastUsedFirstAndTwiceLooksForEach) {
    RoamingStation station("old");
    std::string saved = station.saved;
    saved.replace(saved.find("AUTH", saved.find("ESSID=middle")), 4, "NONE");
    WriteFile(kSavedFile, saved);
    EXPECT_EQ(TAVIWirelessAutoConnect(), 0);
    EXPECT_EQ(station.Tried(), "new\nold\n");
    EXPECT_EQ(station.Lookups(), 5);
    EXPECT_EQ(station.log.Count("Time out to connect AP"), 1);
    EXPECT_THAT(Addresses(), HasSubstr("10.0.0.1/24"));
    EXPECT_FALSE(station.Disconnected());
}

TEST(AutoConnect, LeavesTheAdapterDisconnectedWhenItFails) {
    const struct {
        const char *joinable, *change, *log;  // what is done to the file
        bool isDisconnected;
    } kCases[] = {
        {"none", ":", "Failed to connect any access point", true},
        {"new", "rm", "Failed to enumerate wireless network configurations", false},
        {"new", "sed -i s/IPADDR=.*/IPADDR=dhcp/", "Failed to set interface configuration", true},
    };
    for (const auto& c : kCases) {
        RoamingStation station(c.joinable);
        Shell(std::string(c.change) + " " + kSavedFile);
        EXPECT_EQ(TAVIWirelessAutoConnect(), -1);
        EXPECT_TRUE(station.log.Has(c.log)) << c.log;
        // Without a network to wait for, nothing associated us.
        EXPECT_EQ(station.Disconnected(), c.isDisconnected);
        EXPECT_FALSE(Exists(kRecord));
    }
}

TEST(AutoConnect, EndsAConnectionThatExists) {
    RoamingStation station("new");
    station.driver.accessPoint = {2};
    EXPECT_EQ(TAVIWirelessAutoConnect(), -1);
    EXPECT_TRUE(station.log.Has("Connection exists"));
    EXPECT_TRUE(station.Disconnected());
    EXPECT_EQ(station.Tried(), "");
}

}  // namespace
}  // namespace taviwireless::test
