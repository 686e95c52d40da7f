// Leaving a network. kill() can be made to fail.
#include <signal.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>

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

constexpr char kDhcpPid[] = "/etc/dhcpc/dhcpcd-wlan0.pid";
constexpr char kBackup[] = "/etc/resolv.conf.wireless.bak";
constexpr char kEssidOff[] = "/sbin/iwconfig wlan0 essid off";
constexpr char kNoAddress[] = "/sbin/ifconfig wlan0 0.0.0.0";
constexpr char kTerminate[] = "/usr/sbin/wpa_cli terminate";

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
    const std::string pid = std::to_string(station.dhcpClient.Pid());
    EXPECT_EQ(station.log.Count("dhcpcd pid[" + pid + "] still exists, wait 1 second"), 2);
    EXPECT_EQ(station.dhcpClient.Wait(), 128 + SIGKILL);
    for (const char* gone : {"4000000\n", "0\n"}) {
        WriteFile(kDhcpPid, gone);
        EXPECT_EQ(TAVIWirelessNetworkDisconnect_core(), 0);
        EXPECT_FALSE(Exists(kDhcpPid)) << gone;
    }
}

TEST(Disconnect, StopsAtTheFirstStepThatFails) {
    size_t steps = 0;
    for (const char* step : {"essid off", "0.0.0.0", "wpa_cli terminate"}) {
        ConnectedStation station;
        station.driver.unrunnable = step;
        EXPECT_EQ(TAVIWirelessNetworkDisconnect_core(), -1);
        EXPECT_EQ(station.tools.Commands().size(), steps++);
        EXPECT_THAT(station.log.Text(), testing::ContainsRegex("_disconnect.cpp:[0-9]+ Failed to "
                                                               "execute '/.*" +
                                                               std::string(step) + ".*'\n"));
    }
    ConnectedStation station;
    Shell("cd /etc; rm resolv.conf; mkdir resolv.conf");
    EXPECT_EQ(TAVIWirelessNetworkDisconnect_core(), -1);
    EXPECT_TRUE(station.log.Has("Failed to rename '/etc/resolv.conf.wireless.bak'"));
}

}  // namespace
}  // namespace taviwireless::test
