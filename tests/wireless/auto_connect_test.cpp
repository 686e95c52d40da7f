// Joining the saved network that was used last.
#include "tests/support/sleep_capture.h"
#include "tests/wireless/station_fixture.h"

namespace taviwireless::test {
namespace {

using testing::Contains;
using testing::HasSubstr;

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

TEST(AutoConnect, TriesTheLastUsedFirstAndTwiceLooksForEach) {
    RoamingStation station("old");
    EXPECT_EQ(TAVIWirelessAutoConnect(), 0);
    EXPECT_EQ(station.Tried(), "new\nmiddle\nold\n");
    EXPECT_EQ(station.Lookups(), 6);
    EXPECT_EQ(station.log.Count("Time out to connect AP"), 2);
    EXPECT_THAT(Addresses(), HasSubstr("10.0.0.1/24"));
    EXPECT_FALSE(station.Disconnected());
}

TEST(AutoConnect, SkipsANetworkOfUnknownKindThatIsNotInRange) {
    RoamingStation station("middle");
    std::string saved = station.saved;
    saved.replace(saved.find("AUTH", saved.find("ESSID=new")), 4, "NONE");
    WriteFile(kSavedFile, saved);
    EXPECT_EQ(TAVIWirelessAutoConnect(), 0);
    EXPECT_EQ(station.Tried(), "middle\n");
    EXPECT_EQ(station.Lookups(), 3);
}

TEST(AutoConnect, LeavesTheAdapterDisconnectedWhenItFails) {
    struct Case {
        const char* joinable;
        const char* change;  // what is done to the file
        std::vector<const char*> log;
    };
    const char* const kNothingJoined = "Failed to connect any access point";
    const Case kCases[] = {
        {"none", ":", {kNothingJoined}},
        {"new", "rm", {"Failed to enumerate wireless network configurations", kNothingJoined}},
        {"new", "sed -i s/IPADDR=.*/IPADDR=dhcp/", {"Failed to set interface configuration"}},
    };
    for (const Case& c : kCases) {
        RoamingStation station(c.joinable);
        station.driver.accessPoint = {};
        Shell(std::string(c.change) + " " + kSavedFile);
        EXPECT_EQ(TAVIWirelessAutoConnect(), -1);
        for (const char* text : c.log) {
            EXPECT_TRUE(station.log.Has(text)) << text;
        }
        EXPECT_EQ(station.log.Has(kNothingJoined), c.log.back() == kNothingJoined);
        // Without a network to wait for, nothing associated us.
        EXPECT_EQ(station.Disconnected(), !station.sleeps.Calls().empty());
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
