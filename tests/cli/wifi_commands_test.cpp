// SPDX-License-Identifier: MIT
// taviwireless wifi, end to end: the program, the library, a real interface, and stand-ins for the
// tools that need a radio.
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <thread>

#include "base/split.h"
#include "base/unique_fd.h"
#include "tests/cli/cli_runs.h"
#include "tests/support/wait.h"
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
              "   NETWORK   SIGNAL      SECURITY     CHANNEL  BSSID              SAVED\n"
              "   My Home   [####] 76%  WPA2PSK/AES  6        00:11:22:33:44:AA  -\n"
              "   B\u00FCro      [##--] 50%  WPA2EAP/AES  11       00:11:22:33:44:77  -\n"
              "   Open?[2J  [##--] 30%  open         1        00:11:22:33:44:55  -\n"
              "   Old       [#---] 5%   WEP          11       00:11:22:33:44:66  -\n")
        << scan.err;
    const Json::Value networks = Parse(Wifi({"scan", "--json"}).out);
    ASSERT_EQ(networks.size(), 4u);
    EXPECT_EQ(networks[0]["auth"], "WPA2PSK");
    EXPECT_EQ(networks[2]["ssid"], "Open\033[2J");
    EXPECT_EQ(networks[2]["signal"], 30);
}

// Columns, where each character has one, without the line's end.
size_t Width(const std::string& line) {
    return static_cast<size_t>(std::count_if(
        line.begin(), line.end(), [](char c) { return (c & 0xC0) != 0x80 && c != '\r'; }));
}

// What the library's scan does not know: a network without a name, and newer protection.
constexpr char kNewer[] =
    "          Cell 01 - Address: 00:11:22:33:44:01\n"
    "                    Channel:3\n"
    "                    Quality=35/70  Signal level=-75 dBm\n"
    "                    Encryption key:on\n"
    "                    ESSID:\"\\x00\\x00\\x00\"\n"
    "                    IE: IEEE 802.11i/WPA2 Version 1\n"
    "                        Authentication Suites (1) : PSK\n"
    "          Cell 02 - Address: 11:11:11:11:11:11\n"
    "                    ESSID:\"Newer\"\n"
    "                    IE: IEEE 802.11i/WPA2 Version 1\n"
    "                        Authentication Suites (1) : unknown (8)\n";

TEST_F(WifiCommands, AScanShowsWhatIsHiddenNewerInUseAndSaved) {
    AddScanner(tools, {ScanLine(6, "My Home", "00:11:22:33:44:aa", 76, "11b/g/n", "WPA2PSK/AES") +
                       ScanLine(11, "Newer", "11:11:11:11:11:11", 60, "11b/g/n", "UNKNOW/AES")});
    WriteFile("/tmp/scan/last", kNewer);
    ASSERT_EQ(ConnectHome("the right key\n").status, 0);
    EXPECT_EQ(Wifi({"scan"}).out,
              "   NETWORK   SIGNAL      SECURITY     CHANNEL  BSSID              SAVED\n"
              "   My Home   [####] 76%  WPA2PSK/AES  6        00:11:22:33:44:AA  yes\n"
              "*  Newer     [###-] 60%  WPA3         11       11:11:11:11:11:11  -\n"
              "   (hidden)  [##--] 50%  WPA2PSK      3        00:11:22:33:44:01  -\n");
    EXPECT_THAT(Wifi({"connect", "Newer"}).err,
                StartsWith("taviwireless: Newer wants WPA3; the adapter is driven by"));
    EXPECT_EQ(RunProgram({"env", "LC_ALL=C", BuiltProgram("taviwireless_with_wifi"), "wifi", "scan",
                          "--channels"})
                  .out,
              "2.4 GHz   1  2  3  4  5  6  7  8  9  10 11 12 13\n"
              "My Home            :::+++%%%+++:::                 76%\n"
              "* Newer                           :::===+++===:::  60%\n"
              "(hidden)  :::---===---:::                          50%\n"
              "all       :::---===+++***%%%+++::::::===+++===:::\n");
    AddScanner(tools, {ScanLine(6, "My Home", "00:11:22:33:44:aa", 76, "11b/g/n", "NONE") +
                       ScanLine(36, std::string(32, 'n'), "00:11:22:33:44:ab", 9, "11a", "NONE")});
    for (const size_t columns : {40, 80, 200}) {
        const std::string picture =
            Shell("script -qec 'stty cols " + std::to_string(columns) + "; LC_ALL=C.UTF-8 \"" +
                  BuiltProgram("taviwireless_with_wifi") +
                  "\" wifi scan --channels 2> /dev/null' /dev/null");
        EXPECT_THAT(picture, HasSubstr("76%"));
        for (const std::string& line : Lines(picture)) {
            EXPECT_LE(Width(line), columns) << picture;
        }
    }
}

TEST_F(WifiCommands, AJoinedNetworkIsSavedAndJoinedAgainWithoutItsKey) {
    const RunResult joined = ConnectHome("the right key\n");
    EXPECT_EQ(joined.out, "wlan0: connected to My Home, 192.168.9.20\n") << joined.err;
    EXPECT_EQ(FileMode(kSaved), 0600u);
    EXPECT_THAT(Shell("ip route show default"), StartsWith("default via 192.168.9.1 dev wlan0"));
    EXPECT_EQ(Wifi({"gateway"}).out, "192.168.9.1\n");
    EXPECT_THAT(Wifi({"status"}).out, HasSubstr("Signal     [###-] 57%\n"));
    EXPECT_EQ(Wifi({"auto"}).out, joined.out);  // it is so already

    EXPECT_EQ(Wifi({"disconnect"}).out, "wlan0: not connected\n");
    EXPECT_EQ(Wifi({"disconnect"}).out, "wlan0: not connected\n");
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

// A supplicant that tells whoever attaches to it these events.
class TellingSupplicant {
  public:
    explicit TellingSupplicant(std::vector<std::string> events) : events_(std::move(events)) {
        Shell("mkdir -p /var/run/wpa_supplicant; rm -f /tmp/told");
        bind(socket_.Get(), reinterpret_cast<const sockaddr*>(&kAddress), sizeof kAddress);
    }
    ~TellingSupplicant() {
        thread_.join();
        unlink(kAddress.sun_path);
    }

  private:
    void Tell() {
        char text[64];
        sockaddr_un from{};
        socklen_t size = sizeof from;
        recvfrom(socket_.Get(), text, sizeof text, 0, reinterpret_cast<sockaddr*>(&from), &size);
        for (const std::string& event : events_) {
            sendto(socket_.Get(), event.data(), event.size(), 0,
                   reinterpret_cast<const sockaddr*>(&from), size);
        }
        WriteFile("/tmp/told", "");
    }

    static constexpr sockaddr_un kAddress{AF_UNIX, "/var/run/wpa_supplicant/wlan0"};
    std::vector<std::string> events_;
    UniqueFd socket_{socket(AF_UNIX, SOCK_DGRAM, 0)};
    std::thread thread_{[this] { Tell(); }};
};

TEST_F(WifiCommands, TheSupplicantsReasonIsInTheSentence) {
    tools.Add("/usr/sbin/wpa_supplicant", "until [ -e /tmp/told ]; do sleep 0.01; done");
    const struct {
        std::vector<std::string> events;
        std::string sentence;
    } kCases[] = {
        {{"<3>CTRL-EVENT-NETWORK-NOT-FOUND "}, "its access point was not found: it may be"},
        {{"<3>CTRL-EVENT-SSID-TEMP-DISABLED id=0 ssid=\"My Home\" auth_failures=1 duration=10 "
          "reason=WRONG_KEY",
          "<3>CTRL-EVENT-NETWORK-NOT-FOUND "},
         "its access point refused the key"},
        {{"<3>CTRL-EVENT-SCAN-RESULTS "}, "the key may be wrong, or its access point too far away"},
    };
    for (const auto& [events, sentence] : kCases) {
        const TellingSupplicant supplicant(events);
        EXPECT_THAT(Wifi({"connect", "My Home"}, "the wrong key\n").err,
                    StartsWith("taviwireless: could not join My Home: " + sentence));
    }
}

TEST_F(WifiCommands, AFailedAttemptGoesBackOnTheNetworkThatItLeft) {
    ASSERT_EQ(ConnectHome("the right key\n").status, 0);
    const std::vector<std::string> connect{"connect", "B\u00FCro", "--user", "me"};
    EXPECT_THAT(Wifi(connect, "wrong\n").err, HasSubstr("too far away; back on My Home\n"));
    EXPECT_EQ(Parse(Wifi({"status", "--json"}).out)["ssid"], "My Home");
    EXPECT_THAT(Shell("ip route show default"), StartsWith("default via 192.168.9.1 dev wlan0"));
    Shell("sed -i 's/right key/former key/' " + std::string(kSaved));
    EXPECT_THAT(Wifi(connect, "wrong\n").err, HasSubstr("; My Home was left for it, and going "));
    EXPECT_EQ(Parse(Wifi({"status", "--json"}).out)["state"], "not_connected");
}

// Leaves a daemon behind, and takes its time.
constexpr char kHangs[] =
    "case \"$*\" in *'essid off') rm -f /tmp/associated; exit;; esac\n"
    "setsid sleep 1000 & touch /tmp/associated /tmp/joining; exec sleep 1000";

TEST_F(WifiCommands, ASignalUndoesAnAttemptAndEndsAllThatItStarted) {
    tools.Add("/usr/sbin/wpa_supplicant", kHangs);
    tools.Add("/sbin/iwconfig", kHangs);  // that is how an ad-hoc network begins
    const struct {
        int signal;
        std::vector<std::string> arguments;
        const char* state;
    } kCases[] = {{SIGINT, {"connect", "Old"}, "not_connected"},
                  {SIGTERM, {"auto"}, "not_connected"},
                  {SIGHUP, {"adhoc", "Us"}, "interface_down"}};
    WriteFile(kSaved, "[" + std::string(kHomeBssid) + "]\nESSID=My Home\nKEY=the right key\n");
    for (const auto& [number, arguments, state] : kCases) {
        SCOPED_TRACE(arguments[0]);
        Shell("rm -f /tmp/joining");
        std::vector<std::string> argv{"sh", "-c", "exec \"$0\" wifi \"$@\" 2> /tmp/err",
                                      BuiltProgram("taviwireless_with_wifi")};
        argv.insert(argv.end(), arguments.begin(), arguments.end());
        Process joining(argv);
        joining.WriteLine("12345");
        ASSERT_TRUE(Eventually([] { return Exists("/tmp/joining"); }));
        joining.Signal(number);
        EXPECT_EQ(joining.Wait(), 128 + number);
        EXPECT_EQ(ReadFile("/tmp/err"), "taviwireless: interrupted: wlan0 is not connected\n");
        EXPECT_EQ(Parse(Wifi({"status", "--json"}).out)["state"], state);
        EXPECT_EQ(Shell("pgrep -x sleep || ls -d /usr/tavi/etc/wpa* /var/tmp/.wireless*; true"),
                  "");
    }
}

TEST_F(WifiCommands, NameServersComeWithAStaticAddressAndGoWithIt) {
    WriteFile("/etc/resolv.conf", "nameserver 9.9.9.9\n");
    const std::vector<std::string> connect = {"connect",         "My Home", "--static",
                                              "192.168.9.20/24", "--dns",   "192.168.9.1,1.1.1.1"};
    const auto inForce = [] { return Parse(Wifi({"status", "--json"}).out)["dns"]; };
    ASSERT_EQ(Wifi(connect, "the right key\n").status, 0);
    EXPECT_EQ(inForce(), "192.168.9.1,1.1.1.1");
    ASSERT_EQ(Wifi({"disconnect"}).status, 0);
    EXPECT_EQ(ReadFile("/etc/resolv.conf"), "nameserver 9.9.9.9\n");
    for (const std::vector<std::string>& again :
         {std::vector<std::string>{"auto"}, {"connect", kHomeBssid}}) {
        EXPECT_EQ(Wifi(again).status, 0);
        EXPECT_EQ(inForce(), "192.168.9.1,1.1.1.1");
        ASSERT_EQ(Wifi({"disconnect"}).status, 0);
    }
}

TEST_F(WifiCommands, ASavedNetworkIsChangedAndForgotten) {
    ASSERT_EQ(ConnectHome("the right key\n").status, 0);
    ASSERT_EQ(Wifi({"saved", "edit", "My Home", "key", "address=10.1.1.2/8", "gateway=10.2.2.1",
                    "dns=10.1.1.1"},
                   "another key\n")
                  .status,
              0);
    const auto saved = [] {
        return Parse(Wifi({"saved", "show", kHomeBssid, "--show-secrets", "--json"}).out);
    };
    EXPECT_EQ(saved()["key"], "another key");
    EXPECT_EQ(saved()["address"], "10.1.1.2");
    EXPECT_EQ(saved()["gateway"], "10.2.2.1");
    EXPECT_EQ(saved()["dns"], "10.1.1.1");
    const std::string before = ReadFile(kSaved);
    const struct {
        std::vector<std::string> settings;
        std::string sentence;
    } kRefused[] = {
        {{"key=secret"}, "key is not taken on the command line"},
        {{"ip=1.2.3.4/8"}, "there is no setting ip; there are key, "},
        {{"address=10.1.1.3/8", "gateway=11.1.1.1"}, "the gateway 11.1.1.1 is not in the"},
        {{"dhcp=yes", "dns=10.1.1.1"}, "gateway and name servers go with a static address"},
        {{"dns=10.1.1"}, "the name server 10.1.1 is no address"},
        {{"user=me"}, "My Home wants no user name"},
    };
    for (const auto& [settings, sentence] : kRefused) {
        std::vector<std::string> edit{"saved", "edit", "My Home"};
        edit.insert(edit.end(), settings.begin(), settings.end());
        const RunResult result = Wifi(edit);
        EXPECT_THAT(result.err, StartsWith("taviwireless: " + sentence));
        EXPECT_EQ(result.status, kUsage);
    }
    EXPECT_EQ(ReadFile(kSaved), before);
    EXPECT_EQ(Wifi({"saved", "edit", "My Home", "dhcp=yes"}).status, 0);
    EXPECT_EQ(saved()["dhcp"], true);
    EXPECT_EQ(Wifi({"forget", "My Home"}).status, 0);
    EXPECT_EQ(ReadFile(kSaved), "");
    EXPECT_EQ(Wifi({"forget", "My Home"}).status, kNotFound);
}

TEST_F(WifiCommands, TheRadioIsSwitchedOffAndOn) {
    WriteFile("/tmp/wireless.info", "PRODUCT=stick\n");
    ASSERT_EQ(ConnectHome("the right key\n").status, 0);
    EXPECT_EQ(Wifi({"radio", "off"}).out, "wlan0: the radio is off\n");
    EXPECT_EQ(Parse(Wifi({"status", "--json"}).out)["state"], "not_connected");
    EXPECT_THAT(Wifi({"connect", "My Home"}).err, HasSubstr("; taviwireless wifi radio on swit"));
    EXPECT_EQ(Wifi({"radio", "on"}).out, "wlan0: the radio is on\n");
    EXPECT_EQ(Wifi({"connect", "My Home"}).status, 0);
    Shell("rm /tmp/wireless.info");
}

TEST_F(WifiCommands, WatchShowsEachChangeInALine) {
    Process watch({BuiltProgram("taviwireless_with_wifi"), "wifi", "watch"});
    EXPECT_EQ(watch.ReadLine(), "wlan0: not connected");
    ASSERT_EQ(ConnectHome("the right key\n").status, 0);
    std::optional<std::string> line;
    do {
        line = watch.ReadLine();
    } while (line && *line != "wlan0: connected to My Home, 192.168.9.20  57%");
    EXPECT_TRUE(line);
    watch.Signal(SIGINT);
    EXPECT_EQ(watch.Wait(), 0);
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
        {{"connect", "My Home"}, "ab\"c#defgh\n", kUsage, "the key of this network holds a # "},
        {{"connect", "My Home"}, "", kFailure, "standard input ended before"},
        {{"connect", "My Home"}, std::string(64, 'a') + "\n", kUsage, "64 hexadecimal digits are"},
        {{"connect", "Old"}, "123456789x\n", kUsage, "a WEP key has 5 or 13 characters, or 10"},
        {{"connect", "B\u00FCro"}, "", kUsage, "B\u00FCro wants a user name; add --user NAME"},
        {{"connect", "a\rb"}, "", kUsage, "the name of a network may not hold a line break"},
        {{"connect", std::string(33, 'n')}, "", kUsage, "the name of a network has 1 to 32 bytes"},
        {{"connect", "X", "--static", "1.2.3.4/33"}, "", kUsage, "1.2.3.4/33 is no address"},
        {{"connect", "X", "--static", "1.2.3.4/24,1.2.5.1"}, "", kUsage, "the gateway 1.2.5.1 is "},
        {{"connect", "My Home", "--dns", "1.2.3.4"}, "", kUsage, "gateway and name servers go wit"},
        {{"adhoc", "My Net"}, "", kUsage, "the name of an ad-hoc network may not hold a blank"},
        {{"mode", "client"}, "", kFailure, "the mode of the adapter could not be changed"},
        {{"mode", "monitor"}, "", kUsage, "MODE: \"monitor\" is none of ap, client; "},
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
        {"rm -f /usr/tavi/etc/wireless_ap.conf /sbin/iwlist",
         "there is no program /sbin/iwlist; install wireless-tools", "interface_down"},
    };
    for (const auto& missing : kCases) {
        SCOPED_TRACE(missing.sentence);
        Shell(missing.situation);
        EXPECT_THAT(Wifi({"connect", "X"}).err, StartsWith("taviwireless: " + missing.sentence));
        EXPECT_EQ(Parse(Wifi({"status", "--json"}).out)["state"], missing.status);
    }
    EXPECT_EQ(
        RunAsNobody({BuiltProgram("taviwireless_with_wifi"), "wifi", "forget", "My Home"}).err,
        "taviwireless: needs root; try sudo taviwireless wifi forget 'My Home'\n");
}

}  // namespace
}  // namespace taviwireless::test
