// SPDX-License-Identifier: MIT
// Scanning: waiting for the adapter, scans until two agree, what is read from the tool's table; names
// and values.
#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include "tests/support/descriptors.h"
#include "tests/support/log_capture.h"
#include "tests/support/sleep_capture.h"
#include "tests/wireless/wifi_fixture.h"
#include "wireless/system/queue.h"

namespace taviwireless::test {
namespace {

using Texts = std::vector<std::string>;
using Networks = wireless::OwnedList<WirelessNetwork>;

constexpr char kTableCommand[] = "/sbin/iwlist wlan0 scanning tavi";
constexpr char kAddress[] = "A0:11:22:33:44:55";

// A table of so many networks: "0", "1", ...
std::string Table(int count) {
    std::string table;
    for (int i = 0; i < count; ++i) {
        table += ScanLine(6, std::to_string(i), kAddress, 70, "bgn", "WPA2PSK/AES");
    }
    return table;
}

// "[ESSID] BSSID channel signal protocol auth encrypt opmode" of each network.
Texts Scanned() {
    Networks networks;
    EXPECT_EQ(TAVIWirelessNetworkScan(0, networks.Head()), 0);
    Texts texts;
    for (const WirelessNetwork& network : networks) {
        char bssid[18], text[128];
        snprintf(text, sizeof text, "[%s] %s %d %d %d %d %d %d", network.essid,
                 TAVIWirelessBssidStringGet(network.bssid, bssid, sizeof bssid), network.channel,
                 network.signal, network.protocol, network.auth, network.encrypt, network.opmode);
        texts.emplace_back(text);
    }
    return texts;
}

TEST(Adapter, IsWaitedForFiveSeconds) {
    ToolStandIns tools;
    AddScanner(tools, {Table(1)});
    for (const size_t plugged : {5u, 6u}) {  // in which wait; there is no sixth
        LogCapture log;
        std::optional<WirelessInterface> adapter;
        size_t waits = 0;
        SleepCapture sleeps([&](unsigned) {
            if (++waits == plugged) {
                adapter.emplace();
            }
        });
        WirelessNetwork network{};
        const bool isFound = plugged < 6;
        EXPECT_EQ(TAVIWirelessNetworkGet("0", WIRELESS_KEY_ESSID, &network), isFound ? 1 : -1);
        EXPECT_EQ(sleeps.Calls(), std::vector<unsigned>(isFound ? 6 : 5, 1));
        EXPECT_EQ(log.Count("Wait for wlan0 ready, "), 5);
        EXPECT_EQ(log.Has("There is no wireless USB adapter plugged"), !isFound);
    }
}

// An adapter, a recording iwlist, and no waiting.
struct Scan : testing::Test {
    WirelessInterface adapter;
    ToolStandIns tools;
    SleepCapture sleeps;
    LogCapture log;
};

TEST_F(Scan, IsRepeatedUntilTwoGiveTheSameNumber) {
    const std::pair<std::vector<int>, const char*> kRows[] = {
        {{4, 4}, "Scan 1: success.\n"},
        {{3, 4, 4}, "Scan 2: success.\n"},
        {{2, 0, 2, 2}, "Scan 3: success.\n"},
        {{0, 0, 0, 0, 0}, "Scan 4: no scan result.\n"},
        {{3, 4, 5, 6, 7}, "Scan 4: result is un-stable.\n"}};
    for (const auto& [counts, lastLine] : kRows) {
        Texts tables;
        std::transform(counts.begin(), counts.end(), std::back_inserter(tables), Table);
        AddScanner(tools, tables);
        tools.ForgetCommands();
        log.Clear();
        EXPECT_EQ(Scanned().size(), static_cast<size_t>(counts.back()));
        EXPECT_EQ(tools.Commands(), Texts(counts.size(), kTableCommand));
        EXPECT_EQ(log.Lines().size(), counts.size()) << log.Text();
        EXPECT_THAT(log.Text(), testing::EndsWith(lastLine));
    }
}

TEST_F(Scan, ReadsALineByItsColumns) {
    const std::string read = " A0:11:22:33:44:55 ";
    const struct {
        std::string line;
        std::string network = "";  // empty: none
        std::string logged = "";
    } kRows[] = {
        {ScanLine(6, "My Net", "0:1:2:a:B:cc", 70, "11b/g/n", "wpa2psk/aes"),
         "[My Net] 00:01:02:0A:0B:CC 6 70 10 5 8 0"},
        {ScanLine(140, " x ", kAddress, -52, "a/n", "None"), "[ x]" + read + "140 -52 9 1 1 0"},
        {ScanLine(1, "n", kAddress, 9, std::string(33, 'p'), "s"), "[n]" + read + "1 9 0 0 0 0",
         "Failed to parse security field 'pp'"},
        {ScanLine(1, "n", kAddress, 9, "b", "WPA2PSK"), "[n]" + read + "1 9 2 0 0 0",
         "Failed to parse security field 'WPA2PSK'"},
        {"  x  no channel                      00:11:22:33:44:55 70 b NONE\n", "",
         "Failed to parse channel(  x  no"},
        {ScanLine(1, "n", "00-11-22-33-44-55", 9, "b", "NONE"), "", "network info(1    n  "},
        {ScanLine(1, "n", kAddress, 9, "b", ""), "", "Failed to parse network info(1    n  "},
    };
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.line);
        AddScanner(tools, {row.line});
        log.Clear();
        EXPECT_EQ(Scanned(), row.network.empty() ? Texts{} : Texts{row.network});
        EXPECT_EQ(log.Has("Failed to parse"), !row.logged.empty());
        EXPECT_TRUE(log.Has(row.logged)) << log.Text();
    }
}

TEST_F(Scan, FindsOneNetworkAndTriggersAnotherScanWhenThereIsNone) {
    AddScanner(tools, {ScanLine(1, "home", "0:0:0:0:0:1", 10, "b", "NONE") +
                       ScanLine(2, "Home", "0:0:0:0:0:2", 20, "b", "WEP")});
    const unsigned char second[6] = {0, 0, 0, 0, 0, 2};
    const unsigned char other[6] = {0, 0, 0, 0, 0, 3};
    const struct {
        const void* key;
        int kind;
        int channel;  // 0: not found
    } kRows[] = {{"Home", WIRELESS_KEY_ESSID, 2}, {"home", WIRELESS_KEY_ESSID, 1},
                 {"HOME", WIRELESS_KEY_ESSID, 0}, {second, WIRELESS_KEY_BSSID, 2},
                 {other, WIRELESS_KEY_BSSID, 0},  {"nothing", 2, 1}};
    const auto before = OpenDescriptors();
    for (const auto& row : kRows) {
        WirelessNetwork network{};
        EXPECT_EQ(TAVIWirelessNetworkGet(row.key, row.kind, &network), row.channel > 0 ? 1 : 0);
        EXPECT_EQ(network.channel, row.channel);
        EXPECT_EQ(network.link.next, nullptr);
    }
    EXPECT_EQ(OpenDescriptors(), before);

    AddScanner(tools, {"", "", "", "", "", Table(1)});
    tools.ForgetCommands();
    WirelessNetwork network{};
    EXPECT_EQ(TAVIWirelessNetworkGet("0", WIRELESS_KEY_ESSID, &network), 1);
    Texts commands(7, kTableCommand);
    commands.insert(commands.begin() + 5, "/sbin/iwlist wlan0 scanning");
    EXPECT_EQ(tools.Commands(), commands);
}

// Names of values, and addresses.
template <typename StringGet>
std::string Printed(int last, StringGet stringGet) {
    std::string text;
    for (int value = -1; value <= last; ++value) {
        text += std::string(stringGet(value)) + "|";
    }
    return text;
}

TEST(Names, OfValuesAreOneEach) {
    EXPECT_EQ(Printed(9, TAVIWirelessAuthStringGet),
              "unknown|unknown|OPEN|SHARED|WEPAUTO|WPAPSK|WPA2PSK|WPANONE|WPAEAP|WPA2EAP|unknown|");
    EXPECT_EQ(Printed(8, TAVIWirelessOpmodeStringGet),
              "Unknown|Auto|Ad-Hoc|Managed|Master|Repeater|Secondeary|Monitor|Unknown|Unknown|");
    EXPECT_EQ(Printed(13, TAVIWirelessProtocolStringGet),
              "unknown|unknown|11b/g|11b|11a|11a/b/g|11g|11a/b/g/n|11n|11g/n|11a/n|11b/g/n|"
              "11a/g/n|11b/n|unknown|");
    EXPECT_EQ(Printed(4, [](int bit) { return TAVIWirelessEncryptStringGet(1 << (bit + 1), 0); }),
              "none|WEP|TKIP|AES|unknown|unknown|");
    EXPECT_STREQ(TAVIWirelessEncryptStringGet(3, 1), "unknown");
    EXPECT_STREQ(TAVIWirelessEncryptStringGet(8, 1), "CCMP");
    EXPECT_STREQ(TAVIWirelessEncryptStringGet(12, 0), "TKIP AES");
    EXPECT_STREQ(TAVIWirelessEncryptStringGet(12, 1), "TKIP CCMP");
}

TEST(Address, IsSixHexadecimalGroups) {
    const std::pair<const char*, const char*> kRows[] = {
        {"00:11:22:aa:BB:cc", "00:11:22:AA:BB:CC"},
        {" \t0:1:2:3:4:5", "00:01:02:03:04:05"},
        {"100:1ff:22:0033:44:55 and more", "00:FF:22:33:44:55"},
        {"00-11-22-33-44-55", nullptr},  // refused
        {"00:11:22:33:44:g5", nullptr},
        {"%s%n", nullptr}};
    for (const auto& [text, printed] : kRows) {
        LogCapture log;
        unsigned char bssid[6] = {9, 9, 9, 9, 9, 9};
        char all[18];
        EXPECT_EQ(TAVIWirelessBssidParse(text, bssid), printed != nullptr ? 0 : -1);
        EXPECT_STREQ(TAVIWirelessBssidStringGet(bssid, all, sizeof all),
                     printed != nullptr ? printed : "09:09:09:09:09:09");
        EXPECT_EQ(log.Has("BSSID '" + std::string(text) + "'"), printed == nullptr);
    }
    char cut[6];
    const unsigned char bssid[6] = {0x61, 0x62, 0x63, 0x64, 0x65, 0x66};
    EXPECT_STREQ(TAVIWirelessBssidStringGet(bssid, cut, sizeof cut), "61:62");
}

}  // namespace
}  // namespace taviwireless::test
