// taviwireless wifi, end to end: the program, the library, a real interface, and stand-ins for the
// tools that need a radio.
#include "tests/cli/cli_runs.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

constexpr char kSaved[] = "/usr/tavi/etc/wireless.conf";
constexpr char kHomeBssid[] = "00:11:22:33:44:AA";

RunResult Wifi(std::vector<std::string> arguments, const std::string& input = "") {
    arguments.insert(arguments.begin(), {BuiltProgram("taviwireless_with_wifi"), "wifi"});
    return RunProgram(arguments, input);
}

RunResult ConnectHome(const std::string& input) {
    return Wifi({"connect", "My Home", "--static", "192.168.9.20/24,192.168.9.1"}, input);
}

// An adapter with networks in range. The one key that is right is "right key".
struct WifiCommands : testing::Test {
    WifiCommands() {
        Shell("rm -rf /usr/tavi/etc /tmp/associated /tmp/no-lease /etc/dhcpc");
        SetSupport("yes");
        Shell("mkdir -p /usr/tavi/etc /etc/dhcpc; cp --remove-destination /bin/sleep /tmp/udhcpc");
        interface.Up();
        AddScanner(tools,
                   {ScanLine(1, "Open\033[2J", "00:11:22:33:44:55", 30, "11b/g", "NONE") +
                    ScanLine(6, "My Home", "00:11:22:33:44:aa", 76, "11b/g/n", "WPA2PSK/AES") +
                    ScanLine(11, "Old", "00:11:22:33:44:66", 5, "11b", "WEP") +
                    ScanLine(11, "B\u00FCro", "00:11:22:33:44:77", 50, "11a/n", "WPA2EAP/AES")});
        tools.Add("/usr/sbin/wpa_supplicant",
                  "if grep -Eq 'right key|NONE' /usr/tavi/etc/wpa_supplicant.conf; then\n"
                  "touch /tmp/associated; fi");
        tools.Add("/usr/sbin/wpa_cli", "[ -e /tmp/associated ] && echo wpa_state=COMPLETED");
        tools.Add("/sbin/iwconfig",
                  "case \"$*\" in wlan0) echo ' Link Quality=40/70';;"
                  "'wlan0 essid off') rm /tmp/associated;; esac");
        tools.Add("/usr/sbin/udhcpc",
                  "[ -e /tmp/no-lease ] && exit 1\n"
                  "printf 'IPADDR=192.168.9.30\\nNETMASK=255.255.255.0\\nGATEWAY=192.168.9.1\\n'"
                  " > /etc/dhcpc/dhcpcd-wlan0.info\n"
                  "/tmp/udhcpc 100 & echo $! > /etc/dhcpc/dhcpcd-wlan0.pid");
    }
    ToolStandIns tools;
    WirelessInterface interface;
};

TEST_F(WifiCommands, AScanIsSortedBySignalAndSteersNoTerminal) {
    const RunResult scan = Wifi({"scan"});
    EXPECT_EQ(scan.out,
              "NETWORK   SIGNAL      SECURITY     CHANNEL  BSSID\n"
              "My Home   [####] 76%  WPA2PSK/AES  6        00:11:22:33:44:AA\n"
              "B\u00FCro      [##--] 50%  WPA2EAP/AES  11       00:11:22:33:44:77\n"
              "Open?[2J  [##--] 30%  open         1        00:11:22:33:44:55\n"
              "Old       [#---] 5%   WEP          11       00:11:22:33:44:66\n")
        << scan.err;
    const Json::Value networks = Parse(Wifi({"scan", "--json"}).out);
    ASSERT_EQ(networks.size(), 4u);
    EXPECT_EQ(networks[0]["auth"], "WPA2PSK");
    EXPECT_EQ(networks[2]["essid"], "Open\033[2J");
    EXPECT_EQ(networks[2]["signal"], 30);
}

TEST_F(WifiCommands, AJoinedNetworkIsSavedAndJoinedAgainWithoutItsKey) {
    const RunResult joined = ConnectHome("the right key\n");
    EXPECT_EQ(joined.out, "wlan0: connected to My Home, 192.168.9.20\n") << joined.err;
    EXPECT_EQ(FileMode(kSaved), 0600u);
    EXPECT_THAT(Shell("ip route show default"), StartsWith("default via 192.168.9.1 dev wlan0"));
    EXPECT_EQ(Wifi({"gateway"}).out, "192.168.9.1\n");
    EXPECT_THAT(Wifi({"status"}).out, HasSubstr("Signal     [###-] 57%\n"));
    EXPECT_EQ(Wifi({"auto"}).status, kBusy);

    EXPECT_EQ(Wifi({"disconnect"}).out, "wlan0: not connected\n");
    EXPECT_EQ(Wifi({"disconnect"}).err, "taviwireless: wlan0 is not connected\n");
    EXPECT_EQ(Wifi({"connect", "My Home"}).out, "wlan0: connected to My Home, 192.168.9.20\n");
    // Joining another network ends the connection first.
    EXPECT_EQ(Wifi({"connect", "Open\033[2J"}).out, "wlan0: connected to Open?[2J, 192.168.9.30\n");
    EXPECT_EQ(Wifi({"disconnect"}).status, 0);
    EXPECT_THAT(Wifi({"auto"}).out, StartsWith("wlan0: connected to "));
}

TEST_F(WifiCommands, SavedNetworksHideTheirKeys) {
    EXPECT_EQ(Wifi({"saved", "list"}).out, "No network is saved.\n");
    EXPECT_EQ(Wifi({"auto"}).status, kNotFound);
    ASSERT_EQ(ConnectHome("the right key\n").status, 0);
    EXPECT_EQ(Parse(Wifi({"saved", "list", "--json"}).out)[0]["bssid"], kHomeBssid);
    for (const char* name : {"My Home", "00:11:22:33:44:aa"}) {
        const RunResult hidden = Wifi({"saved", "show", name});
        EXPECT_THAT(hidden.out, HasSubstr("Key        ********\n")) << hidden.err;
        EXPECT_THAT(hidden.out, Not(HasSubstr("right key")));
        const RunResult shown = Wifi({"saved", "show", name, "--show-secrets", "--json"});
        EXPECT_EQ(Parse(shown.out)["key"], "the right key");
    }
    EXPECT_EQ(Parse(Wifi({"qr", "My Home", "--json"}).out)["qr_text"],
              "WIFI:T:WPA;S:My Home;P:the right key;;");
    EXPECT_EQ(Wifi({"saved", "show", "Elsewhere"}).status, kNotFound);
}

TEST_F(WifiCommands, AFailedConnectionIsUndoneAndNotSaved) {
    const RunResult wrongKey = ConnectHome("the wrong key\n");
    EXPECT_EQ(wrongKey.status, kFailure);
    EXPECT_THAT(wrongKey.err, StartsWith("taviwireless: could not join My Home: the key may be"));
    WriteFile("/tmp/no-lease", "");
    const RunResult noLease = Wifi({"connect", "My Home"}, "the right key\n");
    EXPECT_THAT(noLease.err, HasSubstr("joined My Home but got no address by DHCP"));
    EXPECT_FALSE(Exists("/tmp/associated"));
    EXPECT_FALSE(Exists(kSaved));
    EXPECT_THAT(wrongKey.err + noLease.err, Not(HasSubstr("wrong key")));
}

TEST_F(WifiCommands, ANewKeyReplacesTheSavedOne) {
    ASSERT_EQ(ConnectHome("the right key\n").status, 0);
    Shell("sed -i 's/right key/former key/' " + std::string(kSaved));
    EXPECT_THAT(Wifi({"connect", "My Home"}).err, HasSubstr("; --new-key asks for another key"));
    EXPECT_EQ(Wifi({"connect", "My Home", "--new-key"}, "the right key\n").status, 0);
    EXPECT_THAT(ReadFile(kSaved), HasSubstr("KEY=the right key\n"));
}

TEST_F(WifiCommands, AHiddenNetworkIsDescribedOnceAndRemembered) {
    EXPECT_THAT(Wifi({"connect", "Cave", "--hidden"}).err, HasSubstr("--hidden needs --security"));
    const RunResult joined =
        Wifi({"connect", "Cave", "--hidden", "--security", "wpa2"}, "the right key\n");
    EXPECT_EQ(joined.out, "wlan0: connected to Cave, 192.168.9.30\n") << joined.err;
    EXPECT_THAT(Wifi({"status"}).out, HasSubstr("BSSID      11:11:11:11:11:11\n"));
    EXPECT_THAT(Wifi({"saved", "show", "Cave"}).out, HasSubstr("BSSID      11:11:11:11:11:11\n"));
    EXPECT_EQ(Wifi({"connect", "Cave", "--hidden"}).status, 0);
}

TEST_F(WifiCommands, FailuresAreOneSentenceAndAnExitStatus) {
    const struct {
        std::vector<std::string> arguments;
        std::string input;
        int status;
        std::string sentence;
    } kCases[] = {
        {{"connect", "Nowhere"}, "", kNotFound, "there is no network Nowhere in range; "},
        {{"connect", "My Home"}, "1234567\n", kUsage, "a WPA key has 8 to 63 printable"},
        {{"connect", "My Home"}, std::string(64, 'k') + "\n", kUsage, "a WPA key has 8 to 63"},
        {{"connect", "My Home"}, "", kFailure, "standard input ended before"},
        {{"connect", "Old"}, "123456789x\n", kUsage, "a WEP key has 5 or 13 characters, or 10"},
        {{"connect", "B\u00FCro"}, "", kUsage, "B\u00FCro wants a user name; add --user NAME"},
        {{"connect", "a\rb"}, "", kUsage, "the name of a network may not hold a line break"},
        {{"connect", std::string(33, 'n')}, "", kUsage, "the name of a network has 1 to 32 bytes"},
        {{"connect", "X", "--static", "1.2.3.4/33"}, "", kUsage, "1.2.3.4/33 is no address"},
        {{"connect", "X", "--static", "1.2.3.4/24,1.2.5.1"}, "", kUsage, "the gateway 1.2.5.1 is "},
        {{"adhoc", "My Net"}, "", kUsage, "the name of an ad-hoc network may not hold a blank"},
        {{"mode", "client"}, "", kFailure, "the mode of the adapter could not be changed"},
        {{"mode", "monitor"}, "", kUsage, "MODE: monitor not in {ap,client}"},
    };
    for (const auto& failing : kCases) {
        SCOPED_TRACE(failing.sentence);
        const RunResult text = Wifi(failing.arguments, failing.input);
        EXPECT_EQ(text.status, failing.status);
        EXPECT_THAT(text.err, StartsWith("taviwireless: " + failing.sentence));
    }
    EXPECT_THAT(Parse(Wifi({"connect", "Nowhere", "--json"}).out)["error"].asString(),
                StartsWith("there is no network Nowhere"));
    EXPECT_FALSE(Exists("/usr/tavi/etc/wpa_supplicant.conf"));
}

// What must be there before anything is done, and what status says of it.
TEST(WifiRequirements, WhatIsMissingIsSaidInOneLine) {
    const struct {
        std::string situation, sentence, status;
    } kCases[] = {
        {"true", "this model does not support Wi-Fi: ", "not_supported"},
        {"mkdir -p /etc.defaults; echo support_wireless=yes > /etc.defaults/taviinfo.conf",
         "there is no Wi-Fi adapter: no interface wlan0", "no_adapter"},
        {"ip link add wlan0 type veth peer name wlan0-far; mkdir -p /usr/tavi/etc;"
         "echo PRODUCT=stick > /tmp/wireless.info;"
         "printf '[stick]\n\tunblock=no\n' > /usr/tavi/etc/wireless_ap.conf",
         "the radio is switched off: unblock=no", "interface_down"},
        {"rm /tmp/wireless.info", "cannot tell whether the radio may be used", "interface_down"},
    };
    for (const auto& missing : kCases) {
        SCOPED_TRACE(missing.sentence);
        Shell(missing.situation);
        EXPECT_THAT(Wifi({"connect", "X"}).err, StartsWith("taviwireless: " + missing.sentence));
        EXPECT_EQ(Parse(Wifi({"status", "--json"}).out)["status"], missing.status);
    }
    EXPECT_EQ(RunAsNobody({BuiltProgram("taviwireless_with_wifi"), "wifi", "scan"}).err,
              "taviwireless: Wi-Fi settings need root\n");
}

}  // namespace
}  // namespace taviwireless::test
