// SPDX-License-Identifier: MIT
// What the adapter is doing, as the driver tells it; operation modes and ad-hoc networks.
#include <gmock/gmock.h>
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include "tests/support/descriptors.h"
#include "tests/support/log_capture.h"
#include "tests/wireless/scripted_driver.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;

// The adapter, up, with a scripted driver.
struct Adapter : testing::Test {
    Adapter() {
        interface.Up();
        SetSupport("yes");
        SetQuality("Link Quality=40/70  Signal level=-61 dBm");
        tools.Add("/sbin/iwconfig", "[ $# -gt 1 ] || cat /tmp/quality");
    }
    void SetQuality(const std::string& text) {
        WriteFile("/tmp/quality", "wlan0  IEEE 802.11\n          " + text + "\n");
    }
    int32_t Value(int what) {
        int32_t value = 99;
        return TAVIWirelessCurInfoGet(what, &value) == 0 ? value : -1;
    }
    WirelessStatus Status() {
        WirelessStatus status;
        memset(&status, '#', sizeof status);
        EXPECT_EQ(TAVIWirelessStatusGet(&status), &status);
        EXPECT_EQ(status.status, Value(WIRELESS_INFO_CONN_STATUS));
        return status;
    }
    bool Logged(const std::string& text) {
        const bool isLogged = log.Has(text);
        log.Clear();
        return isLogged;
    }

    WirelessInterface interface;
    ToolStandIns tools;
    ScriptedDriver driver;
    LogCapture log;
};

TEST_F(Adapter, HasAStatusByItsModeAndItsAccessPoint) {
    const struct {
        unsigned mode;
        int status, statusWithAccessPoint, opmode;
    } kRows[] = {{0, 4, 5, 0}, {1, 6, 6, 1}, {2, 4, 5, 2}, {3, 7, 7, 3}, {4, 0, 0, 4},
                 {5, 0, 0, 5}, {6, 7, 7, 6}, {7, 0, 0, 7}, {8, 0, 0, 7}, {~0U, 0, 0, 7}};
    const auto before = OpenDescriptors();
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.mode);
        driver.mode = row.mode;
        driver.accessPoint = {};
        EXPECT_EQ(Value(WIRELESS_INFO_OPMODE), row.opmode);
        EXPECT_EQ(Status().status, row.status);
        driver.accessPoint = {0, 0, 0, 0, 0, 1};
        EXPECT_EQ(Status().status, row.statusWithAccessPoint);
    }
    EXPECT_EQ(TAVIWirelessOpmodeSet(WIRELESS_OPMODE_MANAGED), 0);
    EXPECT_EQ(OpenDescriptors(), before);
    EXPECT_EQ(driver.mode, static_cast<unsigned>(IW_MODE_INFRA));
    driver.refused = {SIOCGIWAP};
    EXPECT_EQ(Status().status, WIRELESS_STATUS_NOT_CONNECTED);
    EXPECT_THAT(driver.interfacesAskedFor, ElementsAre("wlan0"));
    Shell("ip link set wlan0 down");
    EXPECT_EQ(Status().status, WIRELESS_STATUS_INTERFACE_DOWN);
    Shell("ip link delete wlan0");
    log.Clear();
    EXPECT_EQ(Status().status, WIRELESS_STATUS_NO_ADAPTER);
    EXPECT_EQ(TAVIWirelessOpmodeGet(), WIRELESS_OPMODE_UNKNOWN);
    EXPECT_EQ(log.Text(), "");
    SetSupport("no");
    WirelessStatus status;
    EXPECT_EQ(TAVIWirelessStatusGet(&status)->status, WIRELESS_STATUS_NOT_SUPPORTED);
}

TEST_F(Adapter, TellsEssidProtocolAndKeyState) {
    for (const std::string& essid :
         {std::string("a\xFF%s b"), std::string(), std::string(32, 'x'), std::string(33, 'y')}) {
        driver.essid = essid;
        WirelessInfo info;
        memset(&info, '#', sizeof info);
        EXPECT_EQ(TAVIWirelessCurInfoGet(WIRELESS_INFO_ESSID, &info), 0);
        EXPECT_EQ(info.essid, essid.substr(0, 32));
    }
    for (const auto& [name, protocol] : {std::pair("IEEE 802.11bgn", 10),
                                         {"IEEE 802.11", 0},
                                         {"My IEEE 802.11bg", 0},
                                         {"unassociated", 0},
                                         {"b", 0},
                                         {"IEEE 802.11bgnac", 0}}) {
        driver.name = name;
        EXPECT_EQ(Value(WIRELESS_INFO_PROTOCOL), protocol) << name;
    }
    for (const auto& [flags, length, state] :
         {std::tuple(IW_ENCODE_DISABLED, 5, 1), {IW_ENCODE_OPEN, 0, 1}, {IW_ENCODE_OPEN, 64, 2}}) {
        driver.encodingFlags = flags;
        driver.keyLength = length;
        EXPECT_EQ(Value(WIRELESS_INFO_KEY_STATE), state);
    }
}

struct Connected : Adapter {
    Connected() { driver.accessPoint = {0, 1, 2, 3, 4, 5}; }
    WirelessNetwork Network(const std::string& record) {
        WriteFile("/var/tmp/.wireless_current_connection", record);
        const WirelessStatus status = Status();
        EXPECT_EQ(status.status, WIRELESS_STATUS_CONNECTED);
        return status.network;
    }
};

constexpr char kRecord[] = "  my net %s\n10\n5\n8\n00:01:02:03:04:05\n";

TEST_F(Connected, IsToTheNetworkThatWasWrittenDown) {
    const WirelessNetwork n = Network(kRecord);
    EXPECT_STREQ(n.essid, "  my net %s");
    EXPECT_THAT((std::vector{n.protocol, n.auth, n.encrypt, n.channel, n.signal}),
                ElementsAre(10, 5, 8, 0, 57));
    EXPECT_THAT(n.bssid, ElementsAre(0, 1, 2, 3, 4, 5));
    EXPECT_EQ(log.Text(), "");
    const std::string rest = "\n1\n2\n3\n0:1:2:3:4:5\n", k33(33, 'x');
    for (const std::string& record : {std::string("net\n1\n2\n"), rest, k33 + rest}) {
        EXPECT_STREQ(Network(record).essid, "");
        EXPECT_TRUE(Logged("Failed to get wireless network info"));
    }
    EXPECT_EQ(Network(k33.substr(1) + rest).essid, k33.substr(1));
}

TEST_F(Adapter, DescribesItsAdhocNetwork) {
    driver.mode = IW_MODE_ADHOC;
    driver.encodingFlags = IW_ENCODE_OPEN;
    driver.keyLength = 5;
    for (const auto& [essid, shown] :
         {std::pair<std::string, std::string>("100%% %%%% %", "100% %% %"),
          {"%s%n%%%", "%s%n%%"},
          {std::string(32, '%'), std::string(16, '%')},
          {std::string(32, 'x'), std::string(32, 'x')}}) {
        driver.essid = essid;
        EXPECT_EQ(Status().network.essid, shown);
    }
    WirelessNetwork n = Status().network;
    EXPECT_THAT((std::vector{n.opmode, n.protocol, n.auth, n.encrypt, n.signal}),
                ElementsAre(WIRELESS_OPMODE_ADHOC, WIRELESS_PROTOCOL_BGN, 2, 2, 40));
    driver.keyLength = 0;
    SetQuality("Link Quality unknown");
    EXPECT_EQ(TAVIWirelessAdhocNetworkGet(&n), 0);
    EXPECT_THAT((std::vector{n.auth, n.encrypt, n.signal}), ElementsAre(1, 1, 70));
    driver.mode = IW_MODE_INFRA;
    EXPECT_EQ(TAVIWirelessAdhocNetworkGet(&n), -1);
    EXPECT_TRUE(Logged("wlan0 is not Ad-Hoc mode."));
}

WirelessConf AdhocConf(const std::string& essid, int encrypt, const std::string& key) {
    WirelessConf conf{};
    essid.copy(conf.network.essid, sizeof conf.network.essid);
    key.copy(conf.key, sizeof conf.key);
    conf.network.opmode = WIRELESS_OPMODE_ADHOC;
    conf.network.encrypt = encrypt;
    return conf;
}

TEST_F(Adapter, CreatesAnAdhocNetwork) {
    const std::string hostile = "$(touch /tmp/ran)`id`|a;b&'\"";
    const struct {
        std::string essid;
        int encrypt;
        std::string key, command;  // no command: refused
    } kRows[] = {{"our net", 1, "ignored", "off"},
                 {"net", 2, "abcde", "open s:abcde"},
                 {"net", 2, "abcdefghijklm", "open s:abcdefghijklm"},
                 {"net", 2, std::string(26, 'F'), "open " + std::string(26, 'F')},
                 {"net", 2, "123456", ""},
                 {std::string(33, 'n'), 2, std::string(257, 'x'), ""},
                 {hostile, 2, "`id`$", "open s:`id`$"}};
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.key);
        const bool isCreated = !row.command.empty();
        WirelessConf conf = AdhocConf(row.essid, row.encrypt, row.key);
        tools.ForgetCommands();
        driver.modesSet.clear();
        EXPECT_EQ(TAVIWirelessNetworkConnect(&conf), isCreated ? 0 : -1);
        EXPECT_EQ(ReadFile("/tmp/commands"),
                  "/sbin/iwconfig wlan0 essid " + row.essid + "\n" +
                      (isCreated ? "/sbin/iwconfig wlan0 key " + row.command + "\n" : ""));
        EXPECT_THAT(driver.modesSet, ElementsAre(1u));
        EXPECT_NE(Logged("The key is not standard WEP format."), isCreated);
        EXPECT_EQ(TAVINetIsIFUp("wlan0"), isCreated ? 1 : 0);
    }
    EXPECT_FALSE(Exists("/tmp/ran"));
}

}  // namespace
}  // namespace taviwireless::test
