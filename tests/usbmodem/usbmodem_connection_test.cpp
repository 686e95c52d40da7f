// SPDX-License-Identifier: MIT
// Dialling over a simulated modem: with the real dialler and a stand-in for pppd, and with a
// dialler that does as it is told.
#include <gmock/gmock.h>
#include <signal.h>
#include <sys/inotify.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <tavicore/error.h>
#include <tavicore/process.h>
#include <taviwireless/usbmodem.h>
#include <taviwireless/usbmodem_enum_if.h>
#include <unistd.h>

#include "tests/support/descriptors.h"
#include "tests/support/files.h"
#include "tests/support/log_capture.h"
#include "tests/support/modem_simulator.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using usbmodem_lib::USBModem;

constexpr char kLog[] = "/var/lib/usbmodem/wvdial.log.001010123456789";
constexpr char kPidFile[] = "/var/lib/usbmodem/usbmodem.pid.0";
constexpr char kPeer[] = "/etc/ppp/peers/wvdial";
constexpr char kBackup[] = "/etc/ppp/usbmodem_backup_gw";

// An initialised modem 0, and a script as its dialler.
struct DialledModem {
    explicit DialledModem(const std::string& script = "")
        : simulator({"--modem", "12d1,ports=dial/at"}), record(0, "/tmp/usbmodem.info0") {
        InstallDialler(script);
        EXPECT_EQ(record.InitInfo("/dev/ttyUSB1"), 0);
        log.Clear();
    }
    ~DialledModem() { record.NetDisconnect(); }

    std::string Status() {
        bool err = false;
        const std::string status = record.GetNetStatus(err);
        EXPECT_FALSE(err);
        return status;
    }
    // Looks at the link until it has this state.
    bool BecomesStatus(const std::string& status) {
        const bool becomes = Eventually([&] {
            record.UpdateNetStatus();
            return Status() == status;
        });
        record.UpdateNetStatus();  // the look that found it does not count as settled
        return becomes;
    }
    std::string Address() {
        bool err = false;
        return record.GetNetLocalIP(err);
    }

    ModemSimulator simulator;
    USBModem record;
    LogCapture log;
};

TEST(Connection, LivesItsLifeWithTheRealDialler) {
    DialledModem modem;
    Shell("cd '" TAVI_SOURCE_DIR
          "/platform'; cp host_root/dialler/wvdial /usr/tavi/bin/wvdial;"
          "cp --remove-destination appliance_root/pppd /usr/sbin/pppd");
    EXPECT_EQ(modem.Status(), "disconnected");
    EXPECT_EQ(modem.record.NetConnect(), 1);
    EXPECT_TRUE(modem.record.IsUSBModemBusy());
    EXPECT_FALSE(modem.record.IsNewPlugIn());
    EXPECT_EQ(modem.Status(), "connecting");
    modem.simulator.Received("0.1");
    bool err = false;
    EXPECT_EQ(modem.record.GetVendorName(err), "");  // never asked for before, and not now
    EXPECT_EQ(modem.record.PINUnlock("1"), 2);       // busy
    EXPECT_EQ(modem.simulator.Received("0.1").size(), 0u);

    ASSERT_TRUE(modem.BecomesStatus("connected")) << ReadFile(kLog);
    EXPECT_FALSE(modem.record.IsUSBModemBusy());
    EXPECT_EQ(modem.record.GetNetIFName(err), "ppp0");
    EXPECT_EQ(modem.Address(), "10.64.64.64");
    EXPECT_EQ(modem.record.GetRoaming(err), "false");

    Shell("ip address flush dev ppp0");
    EXPECT_EQ(modem.record.UpdateNetStatus(), 1);
    EXPECT_EQ(modem.Status(), "connecting");
    EXPECT_EQ(modem.Address(), "");
    Shell("ip address add 10.64.64.70 peer 10.64.64.65 dev ppp0");
    EXPECT_EQ(modem.Status(), "connected");
    EXPECT_EQ(modem.Address(), "10.64.64.70");

    kill(VEXACReadPidFile(kPidFile), SIGKILL);
    Shell("pkill pppd; while ip link show ppp0 2> /dev/null; do sleep 0.1; done > /dev/null");
    EXPECT_TRUE(modem.BecomesStatus("disconnected"));
    unlink(kPeer);
    EXPECT_EQ(modem.record.NetConnect(), -1);
    EXPECT_EQ(modem.record.GetConnectFailedAttempt(), 1);
    EXPECT_EQ(modem.Status(), "connection_lost");
    WriteFile(kPeer, "noauth\n");
    EXPECT_EQ(modem.record.NetConnect(), 1);
    ASSERT_TRUE(modem.BecomesStatus("connected")) << ReadFile(kLog);
    EXPECT_EQ(modem.record.GetConnectFailedAttempt(), 0);
    EXPECT_EQ(modem.record.NetDisconnect(), 0);
    EXPECT_TRUE(modem.BecomesStatus("disconnected"));
    EXPECT_EQ(modem.record.GetNetIFName(err), "");
    EXPECT_FALSE(Exists(kPidFile));
}

TEST(Dialling, TheDiallerHasNothingOfItsCallersAndLeavesNoZombie) {
    DialledModem modem("ls -l /proc/self/fd > /tmp/fds");
    ASSERT_EQ(modem.record.InitProfile(), 0);
    const int changes = inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
    inotify_add_watch(changes, "/var/lib/usbmodem", IN_ATTRIB);
    const auto before = OpenDescriptors();
    EXPECT_EQ(modem.record.NetConnect(), 1);
    EXPECT_EQ(OpenDescriptors(), before);
    // The child writes its pid file first; that it runs, and with what, shows in the file it
    // writes.
    EXPECT_TRUE(Eventually([] { return Exists("/tmp/fds") && !ReadFile("/tmp/fds").empty(); }));
    EXPECT_NE(getsid(VEXACReadPidFile(kPidFile)), getsid(0));
    const std::string descriptors = ReadFile("/tmp/fds");
    EXPECT_THAT(descriptors, HasSubstr("2 -> " + std::string(kLog)));
    EXPECT_THAT(descriptors, testing::Not(HasSubstr("/dev/pts")));
    EXPECT_THAT(descriptors, testing::Not(HasSubstr("pipe:")));
    EXPECT_EQ(FileMode(kLog), 0600u);  // from the start, not changed to it
    char events[4096] = {};
    const std::string_view changed(events,
                                   std::max<ssize_t>(read(changes, events, sizeof events), 0));
    EXPECT_THAT(changed, HasSubstr("usbmodem.profile"));
    EXPECT_THAT(changed, testing::Not(HasSubstr("wvdial.log")));
    close(changes);
    EXPECT_EQ(modem.record.NetDisconnect(), 0);
    EXPECT_TRUE(modem.BecomesStatus("disconnected"));
    EXPECT_EQ(waitpid(-1, nullptr, WNOHANG), 0);  // the simulator lives; nobody else is ours
}

TEST(Dialling, FailsWithTheReasonAndCountsTheAttempt) {
    DialledModem modem;
    ASSERT_EQ(modem.record.NetConnect(), 1) << modem.log.Text();
    EXPECT_EQ(modem.record.NetConnect(), -1);
    EXPECT_TRUE(modem.log.Has("usbmodem0 is not disconnected"));
    EXPECT_EQ(modem.record.GetConnectFailedAttempt(), 1);
    EXPECT_EQ(modem.record.NetDisconnect(), 0);
    ASSERT_TRUE(modem.BecomesStatus("connection_lost"));

    ASSERT_EQ(modem.record.SetProfileDefaultGW("true"), 0);
    EXPECT_EQ(modem.record.NetConnect(), -1);
    EXPECT_TRUE(modem.log.Has("Get default gateway failed"));
    unlink(kPeer);
    EXPECT_EQ(modem.record.NetConnect(), -1);
    EXPECT_TRUE(modem.log.Has("failed on set default route"));
    EXPECT_EQ(modem.record.GetConnectFailedAttempt(), 3);
    EXPECT_FALSE(modem.record.IsUSBModemBusy());
    modem.simulator.Set("0", "sim", "absent");
    EXPECT_EQ(modem.record.NetConnect(), -1);
    EXPECT_TRUE(modem.log.Has("Net connect failed: PIN is not ready"));
}

TEST(Link, ADiallerThatGivesUpOrWritesAnUnreadableLogIsEnded) {
    for (const std::string& body : {std::string("echo '--> Disconnecting at noon' >&2"),
                                    "rm " + std::string(kLog) + "; mkdir " + kLog}) {
        SCOPED_TRACE(body);
        Shell("rm -rf " + std::string(kLog));
        DialledModem modem(body);
        EXPECT_EQ(modem.record.NetConnect(), 1);
        EXPECT_TRUE(modem.BecomesStatus("disconnected"));
        EXPECT_FALSE(modem.record.IsUSBModemBusy());
        EXPECT_FALSE(Exists(kPidFile));
    }
}

// A modem with a dialler that lives.
struct LiveModem : DialledModem {
    LiveModem() { WriteFile(kPidFile, std::to_string(dialler.Pid()) + "\n"); }

    Process dialler{{"sleep", "1000"}};
};

TEST(Link, ThatCannotBeLookedAtIsNotLost) {
    LiveModem modem;
    ASSERT_EQ(modem.Status(), "connecting");
    rlimit limit{};
    ASSERT_EQ(getrlimit(RLIMIT_NOFILE, &limit), 0);
    const rlimit none = {0, limit.rlim_max};
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &none), 0);
    bool err = false;
    EXPECT_EQ(modem.record.GetNetStatus(err), "");
    EXPECT_TRUE(err);
    EXPECT_FALSE(modem.record.IsNetDisconnected(err));
    EXPECT_EQ(modem.record.UpdateNetStatus(), -1);
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &limit), 0);
    EXPECT_EQ(modem.log.Count("failed on getting link stats"), 3);
    EXPECT_TRUE(modem.log.Has("usbmodem.pid.0: Too many open files"));
    EXPECT_EQ(modem.Status(), "connecting");
}

struct RoutedModem : DialledModem {
    RoutedModem() {
        Shell(
            "ip link add eth7 type veth peer name far7; ip address add 10.7.0.2/24 dev eth7;"
            "ip link set eth7 up; ip link set far7 up; ip route add default via 10.7.0.1");
    }
    std::string Default() { return RunProgram({"ip", "route", "show", "default"}).out; }
};

TEST(DefaultRoute, IsSavedAndGivenBack) {
    RoutedModem modem;
    ASSERT_EQ(modem.record.SetProfileDefaultGW("true"), 0);
    EXPECT_EQ(modem.record.NetConnect(), 1);
    EXPECT_EQ(ReadFile(kBackup), "10.7.0.1\n");
    EXPECT_EQ(ReadFile(kPeer), "noauth\n");
    Shell("ip route delete default");
    EXPECT_EQ(modem.record.NetDisconnect(), 0);
    EXPECT_THAT(modem.Default(), HasSubstr("default via 10.7.0.1"));

    WriteFile("/tmp/pppoe_gw_backup", "10.7.0.9\n");  // goes before our own
    EXPECT_EQ(modem.record.RestoreDefaultRoute(), 0);
    EXPECT_THAT(modem.Default(), HasSubstr("default via 10.7.0.9"));
}

TEST(DefaultRoute, ThatCannotBeGivenBackFallsBackToTheConfiguredOne) {
    RoutedModem modem;
    EXPECT_EQ(modem.record.RestoreDefaultRoute(), -1);
    EXPECT_TRUE(modem.log.Has("Backup gateway is not existed (" + std::string(kBackup) + ")"));
    WriteFile(kBackup, "no address\n");
    EXPECT_EQ(modem.record.RestoreDefaultRoute(), -1);
    EXPECT_TRUE(modem.log.Has("File format error (no address)"));
    WriteFile(kBackup, "192.168.99.1\n");  // behind no link
    EXPECT_NE(modem.record.RestoreDefaultRoute(), 0);
    EXPECT_TRUE(modem.log.Has("Get default gateway failed"));
    WriteFile("/etc/sysconfig/network", "GATEWAY=10.7.0.9\n");
    EXPECT_EQ(modem.record.RestoreDefaultRoute(), 0);
    EXPECT_TRUE(modem.log.Has("Failed to set default gateway (192.168.99.1), try default gateway"));
    EXPECT_THAT(modem.Default(), HasSubstr("default via 10.7.0.9"));
    EXPECT_EQ(modem.record.SetDefaultRoute(""), -1);
    EXPECT_EQ(modem.record.SetDefaultRoute("True"), 0);  // only "true" lets the link take the route
    EXPECT_EQ(ReadFile(kPeer), "noauth\nnodefaultroute\n");
}

TEST(Interfaces, OfModemsAreThoseFromUnitOneHundredOn) {
    VEXACSzList* list = VEXACSzListAlloc(64);
    EXPECT_EQ(TAVIUSBModemEnumIf(&list), 0);
    Shell(
        "for name in ppp0 ppp99 ppp100 ppp101 ppp-x pppoe1; do"
        " ip link add $name type veth peer name far-$name; done");
    EXPECT_EQ(TAVIUSBModemEnumIf(&list), 2);
    EXPECT_STREQ(VEXACSzListGet(list, 0), "ppp100");
    EXPECT_STREQ(VEXACSzListGet(list, 1), "ppp101");
    VEXACSzListFree(list);
    EXPECT_EQ(TAVIUSBModemEnumIf(nullptr), -1);
    EXPECT_EQ(VEXACErrGet(), 0x0D00);
}

}  // namespace
}  // namespace taviwireless::test
