// SPDX-License-Identifier: MIT
// Joining a network and leaving it: what the supplicant is given, what happens around it, and what
// is undone. kill() can be made to fail.
#include <fcntl.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/syscall.h>
#include <sys/un.h>
#include <tavicore/error.h>
#include <unistd.h>

#include <cerrno>
#include <regex>
#include <thread>

#include "base/unique_fd.h"
#include "tests/support/sleep_capture.h"
#include "tests/wireless/station_fixture.h"

namespace {

int refusedKills = 0;

}  // namespace

extern "C" __attribute__((visibility("default"))) int kill(pid_t pid, int number) noexcept {
    if (refusedKills > 0) {
        --refusedKills;
        errno = EPERM;
        return -1;
    }
    return static_cast<int>(syscall(SYS_kill, pid, number));
}

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::Not;

constexpr char kStart[] =
    "/usr/sbin/wpa_supplicant -Dwext -iwlan0 -c/usr/tavi/etc/wpa_supplicant.conf -B "
    "-P/var/run/wpa_supplicant.pid";
constexpr char kStatus[] = "/usr/sbin/wpa_cli status";
constexpr char kTerminate[] = "/usr/sbin/wpa_cli terminate";

// What the real supplicant says to the file: it reads it before it misses the interface.
std::string RealSupplicantSays() {
    return RunProgram({"/usr/sbin/wpa_supplicant.real", "-dd", "-c", kSupplicantFile, "-i",
                       "nosuch", "-D", "wired"})
        .out;
}

TEST(SupplicantFile, SaysHowToJoinAndIsUnderstood) {
    const std::string wpa = "\tkey_mgmt=WPA-PSK\n";
    const std::string psk = "\tpsk=\"a secret\"\n}\n";
    const std::string eap = "\tkey_mgmt=WPA-EAP\n\teap=TTLS PEAP\n";
    const std::string user = "\tidentity=\"me@home\"\n\tpassword=\"a secret\"\n}\n";
    const std::string open = "\tkey_mgmt=NONE\n";
    const std::string wep = "\twep_tx_keyidx=0\n\tauth_alg=OPEN SHARED\n}\n";
    const std::string key63 = "#$(id)\"\\" + std::string(55, 'k');
    const struct {
        int auth, encrypt;
        std::string key, lines;  // these stand behind scan_ssid
    } kCases[] = {
        {5, 8, kKey, wpa + "\tpairwise=CCMP\n" + psk},
        {4, 12, kKey, wpa + "\tpairwise=TKIP CCMP\n" + psk},
        {4, 4, kKey, wpa + "\tpairwise=TKIP\n" + psk},
        {4, 2, kKey, wpa + psk},
        {5, 0, key63, wpa + "\tpsk=\"" + key63 + "\"\n}\n"},
        {7, 4, kKey, eap + "\tpairwise=TKIP\n" + user},
        {8, 1, kKey, eap + user},
        {1, 1, "never\nwritten", open + "}\n"},
        {1, 2, "abcde", open + "\twep_key0=\"abcde\"\n" + wep},
        {2, 2, "a\"b\\ efghijkl", open + "\twep_key0=\"a\"b\\ efghijkl\"\n" + wep},
        {3, 2, "0123456789", open + "\twep_key0=0123456789\n" + wep},
        {3, 2, std::string(26, 'F'), open + "\twep_key0=" + std::string(26, 'F') + "\n" + wep},
        {2, 2, "8 bytes\r", open + wep},
    };
    for (const auto& c : kCases) {
        SCOPED_TRACE(c.lines);
        Station station;
        WirelessConf conf = MakeConf("My Net", c.key, c.auth, c.encrypt);
        EXPECT_EQ(TAVIWirelessNetworkConnect(&conf), 0);
        EXPECT_EQ(ReadFile(kSupplicantFile),
                  "ctrl_interface=/var/run/wpa_supplicant\nnetwork={\n\tssid=\"My Net\"\n"
                  "\tbssid=00:11:22:AA:BB:CC\n\tscan_ssid=1\n" +
                      c.lines);
        EXPECT_EQ(FileMode(kSupplicantFile), 0600u);
        EXPECT_THAT(RealSupplicantSays(), testing::AllOf(HasSubstr("id=0 ssid='My Net'"),
                                                         Not(HasSubstr("ailed to parse"))));
        EXPECT_EQ(station.log.Count("Wrong WEP Format."), c.lines == open + wep);
    }
}

TEST(Connect, StartsTheSupplicantAnewAndRecordsTheNetwork) {
    Station station;
    for (const char* path : {kSupplicantPid, kSupplicantFile, kRecord}) {
        WriteFile(path, "old");
    }
    WriteFile("/etc/resolv.conf", "nameserver 10.0.0.1\n");
    WriteFile("/etc/taviinfo.conf", "runmediaservice=\"yes\"\nnetwork_mediaservice=\"wlan0\"\n");
    station.tools.Add("/etc/rc.mediaservice");
    const std::string essid = "$(touch /tmp/x);`id`|'%s%n'";
    WirelessConf conf = MakeConf(essid);
    conf.network.protocol = WIRELESS_PROTOCOL_BGN;
    conf.anyBssid = 1;
    const SleepCapture sleeps([](unsigned) { EXPECT_TRUE(Exists(kFlag)); });
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    EXPECT_EQ(TAVIWirelessNetworkConnect(&conf), 0);
    EXPECT_EQ(testing::internal::GetCapturedStdout() + testing::internal::GetCapturedStderr(), "");
    // The shell starts the supplicant in the background.
    EXPECT_THAT(
        station.tools.Commands(),
        testing::UnorderedElementsAre(kTerminate, kStart, kStatus, "/etc/rc.mediaservice restart"));
    EXPECT_EQ(station.tools.Commands().front(), kTerminate);
    EXPECT_EQ(sleeps.Calls(), std::vector<unsigned>{1});
    EXPECT_THAT(ReadFile(kSupplicantFile), HasSubstr("\tssid=\"" + essid + "\"\n\tscan_ssid"));
    EXPECT_EQ(ReadFile(kRecord), essid + "\n10\n5\n8\n00:11:22:AA:BB:CC\n");
    EXPECT_FALSE(Exists("/tmp/x"));
    EXPECT_EQ(ReadFile("/etc/resolv.conf.wireless.bak"), "nameserver 10.0.0.1\n");
    EXPECT_FALSE(Exists(kFlag));
    EXPECT_EQ(station.log.Text(), "");
}

TEST(Connect, PollsFifteenTimesForTheWholeWord) {
    const std::pair<unsigned, int> kCases[] = {{15, 0}, {16, -1}};
    for (const auto& [completedAt, result] : kCases) {
        Station station;
        station.tools.Add("/etc/rc.mediaservice");  // which no setting asks for
        unsigned polls = 0;
        const SleepCapture sleeps([&polls, at = completedAt](unsigned) {
            WriteFile("/tmp/state", ++polls == at ? "wpa_state=COMPLETED" : "wpa_state=COMPLETED_");
        });
        WirelessConf conf = MakeConf();
        memset(conf.network.bssid, 0, sizeof conf.network.bssid);
        EXPECT_EQ(TAVIWirelessNetworkConnect(&conf), result);
        EXPECT_THAT(ReadFile(kSupplicantFile), Not(HasSubstr("bssid")));
        EXPECT_EQ(sleeps.Calls(), std::vector<unsigned>(15, 1));
        EXPECT_EQ(station.log.Has("Time out to connect AP, kill wpa_supplicant."), result != 0);
        EXPECT_EQ(station.tools.Commands().back(), result != 0 ? kTerminate : kStatus);
        EXPECT_EQ(Exists(kRecord), result == 0);
    }
}

TEST(Connect, WaitsNoLongerOnceTheSupplicantTellsThatItIsConnected) {
    Station station;
    WriteFile("/tmp/state", "wpa_state=ASSOCIATING");
    sockaddr_un address{AF_UNIX, "/var/run/wpa_supplicant/wlan0"};
    Shell("mkdir -p /var/run/wpa_supplicant");
    const UniqueFd supplicant(socket(AF_UNIX, SOCK_DGRAM, 0));
    ASSERT_EQ(bind(supplicant.Get(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    std::thread answering([&] {
        sockaddr_un client{};
        socklen_t size = sizeof client;
        char request[16] = "";
        auto* const to = reinterpret_cast<sockaddr*>(&client);
        recvfrom(supplicant.Get(), request, sizeof request, 0, to, &size);
        WriteFile("/tmp/state", "wpa_state=COMPLETED");
        for (const std::string answer : {"OK\n", "<3>CTRL-EVENT-CONNECTED - Connection to"}) {
            sendto(supplicant.Get(), answer.data(), answer.size(), 0, to, size);
        }
    });
    const SleepCapture sleeps;
    WirelessConf conf = MakeConf();
    EXPECT_EQ(TAVIWirelessNetworkConnect(&conf), 0);
    EXPECT_EQ(sleeps.Calls(), std::vector<unsigned>{1});
    shutdown(supplicant.Get(), SHUT_RDWR);  // it may never have been asked
    answering.join();
}

TEST(Connect, FailsCleanlyAndNeverLeavesTheFlag) {
    const std::string kFailed = "Failed to connect network.\n";
    const std::string kNotSet = "Failed to set [/usr/tavi/etc/wpa_supplicant.conf]\n" + kFailed;
    const std::string kLineBreak = "The ESSID, key or user name holds a line break\n" + kNotSet;
    const struct {
        const char* arrange;
        WirelessConf conf;
        std::string log;
    } kCases[] = {
        {"ip link delete wlan0", MakeConf(), "There is no wireless USB adapter plugged\n"},
        {"touch /var/tmp/.wireless_connecting", MakeConf(),
         "Another connection construction is going\n"},
        {"", MakeConf("a\n\tpsk=b"), kLineBreak},
        {"", MakeConf("a", "b\r"), kLineBreak},
        {"", MakeConf("a", kKey, WIRELESS_AUTH_WPA_NONE),
         "Failed to detect authentication/encryption type\n" + kNotSet},
        {"rm -r /usr/tavi/etc", MakeConf(),
         "Failed to open file[/usr/tavi/etc/wpa_supplicant.conf].\n" + kNotSet},
        {"mkdir /var/tmp/.wireless_current_connection", MakeConf(),
         "Failed to record this connection.\n" + kFailed},
    };
    for (const auto& c : kCases) {
        Station station;
        Shell(c.arrange);
        WirelessConf conf = c.conf;
        EXPECT_EQ(TAVIWirelessNetworkConnect(&conf), -1);
        const std::regex place("wireless_network_connect.cpp:[0-9]+ ");
        EXPECT_EQ(std::regex_replace(station.log.Text(), place, ""), c.log);
        EXPECT_FALSE(Exists(kFlag));
    }
}

// The stand-in notes what it was started with. The caller ignores SIGCHLD, which made each command
// look like one that could not be run.
TEST(Connect, GivesTheSupplicantNothingOfItsCaller) {
    Station station;
    station.tools.Add("/usr/sbin/wpa_supplicant",
                      "{ while read l; do case $l in Sig[BI]*) echo \"$l\"; esac; done\n"
                      "pwd; ls -l /proc/$$/fd; } < /proc/$$/status > /tmp/inherited\n"
                      "touch /tmp/started");
    WriteFile("/tmp/callers", "");
    const UniqueFd descriptor(open("/tmp/callers", O_RDONLY));
    ASSERT_EQ(chdir("/tmp"), 0);
    sigset_t blocked;
    sigfillset(&blocked);
    sigprocmask(SIG_SETMASK, &blocked, nullptr);
    signal(SIGCHLD, SIG_IGN);
    WirelessConf conf = MakeConf();
    EXPECT_EQ(TAVIWirelessNetworkConnect(&conf), 0) << station.log.Text();
    signal(SIGCHLD, SIG_DFL);
    sigemptyset(&blocked);
    sigprocmask(SIG_SETMASK, &blocked, nullptr);
    const std::string inherited = ReadFile("/tmp/inherited");
    EXPECT_THAT(inherited, Not(HasSubstr("callers")));
    EXPECT_THAT(inherited, HasSubstr("SigBlk:\t0000000000000000\n"));
    // The shell, which starts it in the background, has it ignore SIGINT and SIGQUIT; the C library
    // two signals of its own (32 and 33).
    EXPECT_THAT(inherited, testing::ContainsRegex("SigIgn:\t0000000[01][08]0000006\n/\n"));
}

TEST(CheckBlock, TellsWhetherTheUserBlockedTheRadio) {
    const struct {
        const char *settings, *info;
        int result;
    } kCases[] = {
        {"[a;b]\n\tunblock=yes\n", "PRODUCT=a;b\n", 1},  {"[a;b]\n\tx=no\n", "PRODUCT=a;b\n", -1},
        {"[other]\n\tunblock=no\n", "PRODUCT=a;b\n", 1}, {"[a;b]\n", "PRODUCT=\n", -1},
        {"[a;b]\n\tunblock=no\n", "PRODUCT=a;b\n", 0},
    };
    Station station;
    EXPECT_EQ(TAVIWirelessCheckBlock(), 1);
    for (const auto& c : kCases) {
        WriteFile("/usr/tavi/etc/wireless_ap.conf", c.settings);
        WriteFile("/tmp/wireless.info", c.info);
        EXPECT_EQ(TAVIWirelessCheckBlock(), c.result) << c.settings;
    }
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    WriteFile(kFlag, "");
    EXPECT_EQ(TAVIWirelessNetworkConnect(nullptr), 0);  // nothing to do
    EXPECT_FALSE(Exists(kFlag) || Exists(kSupplicantFile));
    EXPECT_EQ(station.log.Text(), "");
}

constexpr char kDhcpPid[] = "/etc/dhcpc/dhcpcd-wlan0.pid";
constexpr char kBackup[] = "/etc/resolv.conf.wireless.bak";
constexpr char kEssidOff[] = "/sbin/iwconfig wlan0 essid off";
constexpr char kNoAddress[] = "/sbin/ifconfig wlan0 0.0.0.0";

// A station that is connected to an access point, with all that connecting leaves behind.
struct ConnectedStation : Station {
    ConnectedStation() {
        driver.accessPoint = {0, 1, 2, 3, 4, 5};
        for (const char* path : {kFlag, kRecord, kSupplicantPid, kSupplicantFile}) {
            WriteFile(path, "");
        }
        WriteFile(kDhcpPid, std::to_string(dhcpClient.Pid()) + "\n");
        WriteFile("/etc/resolv.conf", "new");
        WriteFile(kBackup, "old");
    }

    Process dhcpClient{{"sleep", "1000"}};
};

TEST(Disconnect, UndoesWhatTheStatusAsksFor) {
    const struct {
        const char* arrange;
        unsigned mode;
        std::vector<std::string> commands;
        bool isUndone;  // supplicant, DHCP client and resolver
    } kCases[] = {
        {"true", IW_MODE_INFRA, {kEssidOff, kNoAddress, kTerminate}, true},
        {"ip link delete wlan0", IW_MODE_INFRA, {kTerminate}, true},
        {"true", IW_MODE_ADHOC, {kEssidOff, kNoAddress}, false},
        {"true", IW_MODE_MASTER, {}, false},
        {"ip link set wlan0 down", IW_MODE_INFRA, {}, false},
    };
    for (const auto& c : kCases) {
        ConnectedStation station;
        Shell(c.arrange);
        station.driver.mode = c.mode;
        EXPECT_EQ(TAVIWirelessNetworkDisconnect_core(), 0);
        EXPECT_EQ(station.tools.Commands(), c.commands);
        EXPECT_FALSE(Exists(kFlag));
        EXPECT_EQ(Exists(kRecord), c.commands.empty());
        for (const char* path : {kSupplicantPid, kSupplicantFile, kDhcpPid, kBackup}) {
            EXPECT_EQ(Exists(path), !c.isUndone) << path;
        }
        EXPECT_EQ(ReadFile("/etc/resolv.conf"), c.isUndone ? "old" : "new");
        if (c.isUndone) {
            EXPECT_EQ(station.dhcpClient.Wait(), 128 + SIGKILL);
        }
        if (c.mode == IW_MODE_ADHOC) {
            EXPECT_EQ(station.driver.mode, IW_MODE_INFRA);
            EXPECT_EQ(ReadFile("/sys/class/net/wlan0/operstate"), "down\n");
        }
        EXPECT_EQ(station.log.Text(), "");
    }
}

TEST(Disconnect, WaitsForADhcpClientThatCannotBeKilledAndTidiesUpAfterOneThatIsGone) {
    ConnectedStation station;
    refusedKills = 2;
    const SleepCapture sleeps;
    EXPECT_EQ(TAVIWirelessNetworkDisconnect_core(), 0);
    EXPECT_EQ(sleeps.Calls(), std::vector<unsigned>(2, 1));
    EXPECT_EQ(station.log.Count("] still exists, wait 1 second"), 2);
    EXPECT_EQ(station.dhcpClient.Wait(), 128 + SIGKILL);
    for (const char* gone : {"4000000\n", "0\n"}) {
        WriteFile(kDhcpPid, gone);
        EXPECT_EQ(TAVIWirelessNetworkDisconnect_core(), 0);
        EXPECT_FALSE(Exists(kDhcpPid)) << gone;
    }
}

}  // namespace
}  // namespace taviwireless::test
