// SPDX-License-Identifier: MIT
// Signals that are caught at random moments in everything that waits: results are those without.
#include <fcntl.h>
#include <sys/file.h>
#include <sys/prctl.h>
#include <sys/time.h>
#include <tavicore/process.h>
#include <tavisdk/network.h>
#include <taviwireless/semaphore.h>
#include <taviwireless/usbmodem_client.h>
#include <taviwireless/wireless.h>

#include <csignal>
#include <random>

#include "base/sleep_out.h"
#include "base/unique_pipe.h"
#include "tests/support/bus.h"
#include "tests/support/sleep_capture.h"
#include "tests/support/wait.h"
#include "tests/usbmodem/opened_modem.h"
#include "tests/wireless/station_fixture.h"
#include "wireless/system/queue.h"

namespace taviwireless::test {
namespace {

using usbmodem_lib::USBModem;

volatile unsigned randomNumber;

void Catch(int signal) {
    const int error = errno;
    if (signal == SIGALRM) {
        raise((randomNumber & 0x1000) != 0 ? SIGCHLD : SIGUSR1);
        randomNumber = randomNumber * 1664525 + 1013904223;
        const itimerval next{{}, {0, 100 << (randomNumber >> 29)}};
        setitimer(ITIMER_REAL, &next, nullptr);
    }
    errno = error;
}

// While it lives, signals are caught at random moments, 0.1 to 13 ms apart, as in a program that
// has timers and children of its own: calls that wait end with EINTR.
struct SignalStorm {
    explicit SignalStorm(unsigned seed) {
        randomNumber = seed;
        struct sigaction action {};
        action.sa_handler = Catch;  // without SA_RESTART
        for (const int signal : {SIGCHLD, SIGUSR1, SIGALRM}) {
            sigaction(signal, &action, nullptr);
        }
        raise(SIGALRM);
    }
    ~SignalStorm() { signal(SIGALRM, SIG_IGN); }
};

struct Wait {
    const char* name;
    std::function<std::string()> work;  // returns what came of it
    std::string expected;
};

// TAVI_SEED repeats a failure.
void ExpectWithSignals(const std::vector<Wait>& rows) {
    const char* given = getenv("TAVI_SEED");
    const unsigned seed = given != nullptr ? std::stoul(given) : std::random_device()();
    for (const Wait& row : rows) {
        for (unsigned i = 0; i < 2; ++i) {
            const SignalStorm storm(seed + i);
            EXPECT_EQ(row.work(), row.expected) << row.name << ", TAVI_SEED=" << seed + i;
        }
    }
}

// A process that takes something, holds it for a moment and gives it back. Returns when it is
// taken.
template <typename Take, typename GiveBack>
void HoldForAMoment(Take take, GiveBack giveBack) {
    UniquePipe taken;
    if (fork() == 0) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        take();
        taken.writeEnd.Close();
        usleep(50000);
        giveBack();
        _exit(0);
    }
    taken.ReadByte();
}

TEST(Signals, ChangeNoExchangeWithAModem) {
    ModemSimulator simulator({"--modem", "12d1,id=1,ports=dial/at"});
    InstallDialler(kSaysConnected);
    LogCapture log;
    std::string text;
    bool failed = false;
    USBModem modem(1, kInfo1);
    semaphore::Semaphore lock(1);
    ExpectWithSignals({
        {"finding the ports",
         [&] {
             modem.CloseFileDevice();
             return modem.InitInfo() == 0 ? modem.GetQueryNode() : "";
         },
         kQueryPort},
        {"a slow reply in pieces",
         [&] {
             setenv("TAVI_QUIET_WAITS", "whole", 1);
             simulator.Fault("1", "slow=100");
             simulator.Fault("1", "pieces=9/60");
             const int result = modem.ModemCmd("AT+CSQ", text);
             simulator.Fault("1", "off");
             unsetenv("TAVI_QUIET_WAITS");
             return result == 0 ? text : log.Text();
         },
         "+CSQ: 17,99\nOK\n"},
        {"the lock of a modem",
         [&] {
             log.Clear();
             HoldForAMoment([&] { lock.Enter(); }, [] {});  // its end gives it back
             return modem.ModemCmd("AT+CGMM", text) == 0 ? text : log.Text();
         },
         "E1752\nOK\n"},
        {"a new profile",
         [&] { return modem.ResetProfile() == 0 ? modem.GetProfileAPN(failed) : ""; }, "internet"},
        {"dialling and hanging up",
         [&] {
             const bool dials =
                 modem.NetConnect() == 1 && Exists("/var/lib/usbmodem/usbmodem.pid.1");
             const bool connects = dials && Eventually([&] {
                                       modem.UpdateNetStatus();
                                       return modem.GetNetStatus(failed) == "connected";
                                   });
             modem.UpdateNetStatus();  // the look that found it does not count as settled
             modem.NetDisconnect();
             return connects ? modem.GetNetStatus(failed) : "";
         },
         "disconnected"},
    });
}

TEST(Signals, ChangeNoAnswerOfTheService) {
    ServedModems served("12d1,ports=dial/at");
    dbus::USBModemClient client;
    std::string text;
    const auto ask = [&] { return client.GetUSBModem("usbmodem0", text) == 0 ? text : ""; };
    const std::string answer = ask();
    ASSERT_THAT(answer, testing::HasSubstr("E1752"));
    ExpectWithSignals({{"a question", ask, answer}});
}

// Results of calls, in their order.
std::string Results(std::initializer_list<int> results) {
    return testing::PrintToString(std::vector<int>(results));
}

TEST(Signals, ChangeNothingOfTheWifiAdapter) {
    Station station;
    const SleepCapture sleeps;
    SetSupport("yes");
    WriteFile("/tmp/wireless.info", "PRODUCT=stick\nAP_SUPPORT=yes\n");
    WriteFile("/usr/tavi/etc/wireless_ap.conf", "[stick]\n\tenable=yes\n\tunblock=yes\n");
    const std::string networks = ScanLine(1, "one", "02:00:00:00:00:01", 10, "g", "NONE") +
                                 ScanLine(6, "two", "02:00:00:00:00:02", 10, "g", "WEP");
    station.tools.Add("/sbin/iwlist", "printf 'Ch\n--\n'; sleep 0.03; printf '" + networks + "'");
    station.tools.Add("/sbin/iwconfig", "sleep 0.03; echo Link Quality=40/70");
    station.tools.Add("/sbin/ifconfig", "sleep 0.03; touch /tmp/released");
    station.tools.Add("/usr/sbin/wpa_cli", "sleep 0.03; echo wpa_state=COMPLETED");
    station.tools.Add("/etc/rc.network", "sleep 0.03");
    station.driver.accessPoint.fill(0x11);
    WirelessConf conf = MakeConf();
    ExpectWithSignals({
        {"a scan",
         [] {
             wireless::OwnedList<WirelessNetwork> networks;
             std::string names = Results({TAVIWirelessNetworkScan(1, networks.Head())});
             for (const WirelessNetwork& network : networks) {
                 names += network.essid;
             }
             return names;
         },
         "{ 0 }onetwo"},
        {"joining, looking and leaving",
         [&] {
             WirelessStatus status{};
             const bool joins = TAVIWirelessNetworkConnect(&conf) == 0;
             TAVIWirelessStatusGet(&status);
             const bool leaves = TAVIWirelessNetworkDisconnect_core() == 0;
             const bool waits = leaves && remove("/tmp/released") == 0;
             return Results({joins, status.network.signal, waits}) + status.network.essid;
         },
         "{ 1, 57, 1 }My Net"},
        {"the lock of a file",
         [&] {
             const UniqueFd file(open("/usr/tavi/etc/.wireless.conf.lock", O_RDWR | O_CREAT, 0600));
             const auto lock = [&file](int how) { flock(file.Get(), how); };
             HoldForAMoment([&] { lock(LOCK_EX); }, [&] { lock(LOCK_UN); });
             return Results({TAVIWirelessConfSet(&conf)});
         },
         "{ 0 }"},
        {"an access point",
         [] {
             return Results({TAVIWirelessAPEnable(), TAVIWirelessAPDisable()});
         },
         "{ 1, 1 }"},
        {"what the kernel tells",
         [] {
             VEXANetInterfaceInfo interfaces[4];
             int count = 0;
             for (int i = 0; i < 200; ++i) {
                 count += VEXANetGetInterfaceInfo(interfaces, 4, VEXA_NET_ALL_INTERFACES);
             }
             return Results({count});
         },
         "{ 400 }"},
        {"a program's end",
         [] { return Results({VEXACExec("sh", "-c", "sleep 0.03; exit 7", nullptr)}); }, "{ 7 }"},
    });
}

TEST(Signals, CutNoPauseShort) {
    const SleepCapture interrupted([](unsigned) { errno = EINTR; });
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_TRUE(SleepOut(1));
    EXPECT_GE(std::chrono::steady_clock::now() - begin, std::chrono::seconds(1));
}

}  // namespace
}  // namespace taviwireless::test
