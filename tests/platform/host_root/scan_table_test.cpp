// SPDX-License-Identifier: MIT
// The table of the host root's iwlist: from the bytes of beacons to what the library's scan reads.
#include "platform/host_root/iwlist/scan_table.h"

#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include "tests/wireless/wifi_fixture.h"

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

const std::string kRates = Bytes("01 08 82 84 8b 96 0c 12 18 24 32 04 30 48 60 6c");

constexpr bool kPrivate = true;

ScanResult Beacon(int frequency, int signal, bool isPrivate, const std::string& elements) {
    return {{0x00, 0x11, 0x22, 0x33, 0x44, 0x55}, frequency, signal, 0, isPrivate, elements};
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
        {"30 18 01 00 00 0f ac 04 01 00 00 0f ac 04 02 00 00 0f ac 02 00 0f ac 08 80 00",
         "WPA2PSK/AES"},  // WPA3 for those who can
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
