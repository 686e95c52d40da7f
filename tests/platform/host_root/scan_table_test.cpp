// The table of the host root's iwlist: from the bytes of beacons to what the library's scan reads.
#include "platform/host_root/iwlist/scan_table.h"

#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include "tests/wireless/wifi_fixture.h"
#include "wireless/system/queue.h"

namespace taviwireless::test {
namespace {

using iwlist::ScanResult;

std::string Bytes(const std::string& hex) {
    std::string bytes;
    for (size_t i = 0; i + 1 < hex.size(); i += 3) {
        bytes += static_cast<char>(std::stoi(hex.substr(i, 2), nullptr, 16));
    }
    return bytes;
}

std::string Ssid(const std::string& essid) {
    return std::string(1, '\0') + static_cast<char>(essid.size()) + essid;
}

const std::string kSlowRates = Bytes("01 04 82 84 8b 96");
const std::string kRates = Bytes("01 08 82 84 8b 96 0c 12 18 24 32 04 30 48 60 6c");
const std::string kRatesOf5GHz = Bytes("01 08 8c 12 98 24 b0 48 60 6c");
const std::string kHt = Bytes("2d 1a") + std::string(26, '\x01');
const std::string kRsnPskCcmp =
    Bytes("30 14 01 00 00 0f ac 04 01 00 00 0f ac 04 01 00 00 0f ac 02 00 00");
const std::string kRsnPskMixed =
    Bytes("30 18 01 00 00 0f ac 02 02 00 00 0f ac 04 00 0f ac 02 01 00 00 0f ac 02 00 00");
const std::string kRsnEap =
    Bytes("30 14 01 00 00 0f ac 04 01 00 00 0f ac 04 01 00 00 0f ac 01 00 00");
const std::string kRsnSae =
    Bytes("30 14 01 00 00 0f ac 04 01 00 00 0f ac 04 01 00 00 0f ac 08 c0 00");
const std::string kRsnSaeAndPsk =
    Bytes("30 18 01 00 00 0f ac 04 01 00 00 0f ac 04 02 00 00 0f ac 02 00 0f ac 08 80 00");
const std::string kRsnGroupCipher =
    Bytes("30 14 01 00 00 0f ac 02 01 00 00 0f ac 00 01 00 00 0f ac 06 00 00");
const std::string kWpaPskTkip =
    Bytes("dd 16 00 50 f2 01 01 00 00 50 f2 02 01 00 00 50 f2 02 01 00 00 50 f2 02");
const std::string kWpaEapTkip =
    Bytes("dd 16 00 50 f2 01 01 00 00 50 f2 02 01 00 00 50 f2 02 01 00 00 50 f2 01");
const std::string kWpaNone =
    Bytes("dd 16 00 50 f2 01 01 00 00 50 f2 02 01 00 00 50 f2 02 01 00 00 50 f2 00");
const std::string kWmm = Bytes("dd 07 00 50 f2 02 00 01 00");  // a vendor's, and no protection

constexpr bool kPrivate = true;

ScanResult Beacon(int frequency, int signal, bool isPrivate, const std::string& elements) {
    return {{0x00, 0x11, 0x22, 0x33, 0x44, 0x55}, frequency, signal, 0, isPrivate, elements};
}

TEST(ScanTable, IsReadByTheScanAsWhatTheBeaconsSay) {
    struct Row {
        ScanResult beacon;
        std::string channelAndEssid, rest;
        int protocol, auth, encrypt;
    };
    std::vector<Row> rows = {
        {Beacon(2437, -61, kPrivate, Ssid("My Net") + kRates + kRsnPskCcmp + kHt + kWmm),
         "6    My Net", "70 11b/g/n WPA2PSK/AES", 10, 5, 8},
        {Beacon(2484, -40, false, Ssid("old") + kSlowRates + kWmm), "14   old", "100 11b NONE", 2,
         1, 1},
        {Beacon(5180, -110, kPrivate, Ssid("five") + kRatesOf5GHz + kWpaPskTkip), "36   five",
         "0 11a WPAPSK/TKIP", 3, 4, 4},
        {Beacon(5825, -120, kPrivate, Ssid("five n") + kRatesOf5GHz + kHt + kRsnEap), "165  five n",
         "0 11a/n WPA2EAP/AES", 9, 8, 8},
        {Beacon(5955, -75, kPrivate, Ssid("six") + kRatesOf5GHz + kRsnSae), "1    six",
         "50 unknown UNKNOW/AES", 0, 0, 8},
        {Beacon(2417, -75, false, Ssid(std::string(32, 'w')) + kRates),
         "2    " + std::string(32, 'w'), "50 11b/g NONE", 1, 1, 1},
        {Beacon(2417, -75, false, Ssid(" a\nb\xc3\xbc") + kRates), "2     a?b\xc3\xbc",
         "50 11b/g NONE", 1, 1, 1},
        {Beacon(58320, -75, false, Ssid("5 digits") + kRates), "104745 digits", "50 unknown NONE",
         0, 1, 1},
    };
    const struct {
        std::string protection, text;
        int auth, encrypt;
    } kSecurities[] = {
        {"", "WEP", 3, 2},
        {kWpaPskTkip + kRsnPskCcmp, "WPA1PSKWPA2PSK/TKIPAES", 5, 12},
        {kRsnPskMixed, "WPA2PSK/TKIPAES", 5, 12},
        {kWpaEapTkip + kRsnEap, "WPA1WPA2EAP/TKIPAES", 8, 12},
        {kWpaEapTkip, "WPAEAP/TKIP", 7, 4},
        {kRsnGroupCipher, "WPA2PSK/TKIP", 5, 4},
        {kWpaNone, "WPANONE/TKIP", 6, 4},
        {kRsnSae, "UNKNOW/AES", 0, 8},
        {kRsnSaeAndPsk, "WPA2PSK/AES", 5, 8},
    };
    for (const auto& s : kSecurities) {
        rows.push_back({Beacon(2417, -75, kPrivate, Ssid("x") + kRates + s.protection), "2    x",
                        "50 11b/g " + s.text, 1, s.auth, s.encrypt});
    }
    std::string table;
    for (const Row& row : rows) {
        std::string line = row.channelAndEssid;
        line.resize(38, ' ');
        EXPECT_EQ(TableLine(row.beacon), line + "00:11:22:33:44:55 " + row.rest + "\n");
        table += TableLine(row.beacon);
    }
    table += TableLine(Beacon(2417, -75, false, Ssid("") + kRates));  // hidden: not read
    table += TableLine(Beacon(2417, -75, false, Ssid(std::string(5, '\0')) + kRates));

    const WirelessInterface wlan0;
    ToolStandIns tools;
    WriteFile("/tmp/table", iwlist::TableHeading() + table);
    tools.Add("/sbin/iwlist", "cat /tmp/table");
    wireless::OwnedList<WirelessNetwork> networks;
    ASSERT_EQ(TAVIWirelessNetworkScan(0, networks.Head()), 0);
    auto row = rows.begin();
    for (const WirelessNetwork& n : networks) {
        ASSERT_NE(row, rows.end());
        EXPECT_EQ(n.channel, std::stoi(row->channelAndEssid.substr(0, 5)));
        EXPECT_EQ(n.essid, row->channelAndEssid.substr(5));
        EXPECT_THAT(
            (std::vector{n.signal, n.protocol, n.auth, n.encrypt}),
            testing::ElementsAre(std::stoi(row->rest), row->protocol, row->auth, row->encrypt));
        ++row;
    }
    EXPECT_EQ(row, rows.end());
}

// A beacon is a stranger's: whatever it holds, it is one line of the table, and its ESSID and what
// stands before the fault count.
TEST(ScanTable, SurvivesBrokenElements) {
    const std::pair<const char*, const char*> kRows[] = {
        {"30", "WEP"},           // no size
        {"30 14 01 00", "WEP"},  // shorter than its size
        {"30 00", "WPA2EAP/AES"},
        {"30 01 01", "WPA2EAP/AES"},
        {"30 06 01 00 00 0f ac 04", "WPA2EAP/AES"},  // the rest has its default
        {"30 0c 01 00 00 0f ac 04 01 00 00 0f ac 04", "WPA2EAP/AES"},
        {"30 0e 01 00 00 0f ac 04 ff ff 00 0f ac 02 00 0f", "WPA2EAP/TKIP"},
        {"30 08 01 00 00 0f ac 04 ff ff", "WPA2EAP/UNKNOW"},
        {"dd 03 00 50 f2", "WEP"},
        {"dd 04 00 50 f2 01", "WPAEAP/TKIP"},
    };
    for (const auto& [elements, security] : kRows) {
        const auto beacon = Beacon(2417, -75, kPrivate, Ssid("x") + kRates + Bytes(elements));
        EXPECT_THAT(TableLine(beacon),
                    testing::EndsWith(" 50 11b/g " + std::string(security) + "\n"));
    }
    const std::string longName = Bytes("00 ff") + std::string(255, 'x');
    EXPECT_THAT(TableLine(Beacon(2417, -75, false, longName)),
                testing::HasSubstr(' ' + std::string(32, 'x') + " 00:11:22:33:44:55 50 11b NONE"));
}

TEST(HostIwlist, HandsOtherFormsToTheStockTool) {
    const std::string path = "/usr/sbin/iwlist";
    Shell("cp --remove-destination '" HOST_IWLIST "' " + path);
    Shell("rm -f " + path + ".distrib");
    EXPECT_THAT(RunProgram({path, "wlan0", "scanning"}).err,
                testing::HasSubstr("install wireless-tools"));
    ToolStandIns tools;
    tools.Add(path + ".distrib", "exit 7");
    EXPECT_EQ(RunProgram({path, "wlan0", "scanning"}).status, 7);
    EXPECT_EQ(RunProgram({path, "wlan0", "scanning", "essid", "tavi"}).status, 7);
    EXPECT_THAT(tools.Commands(),
                testing::ElementsAre(path + ".distrib wlan0 scanning",
                                     path + ".distrib wlan0 scanning essid tavi"));
}

}  // namespace
}  // namespace taviwireless::test
