// SPDX-License-Identifier: MIT
// usbmodemd on a real bus: starting, the modems it serves, ending.
#include <gmock/gmock.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <taviwireless/usbmodem_client.h>

#include <filesystem>
#include <iterator>
#include <sstream>

#include "base/unique_fd.h"
#include "tests/support/bus.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

RunResult Usbmodemd(const std::vector<std::string>& arguments) {
    std::vector<std::string> command = {BuiltProgram("usbmodemd")};
    command.insert(command.end(), arguments.begin(), arguments.end());
    return RunProgram(command);
}

TEST(Usbmodemd, SaysWhyItCannotServe) {
    const struct {
        std::vector<std::string> arguments;
        int status;
        std::string out;
        std::string err;
    } kRuns[] = {
        {{"--help"}, 0, "Usage:", ""},
        {{"--version"}, 0, "usbmodemd 4.", ""},
        {{"--fly"}, 2, "", "usbmodemd: Unknown option --fly; see usbmodemd --help\n"},
        {{"now"}, 2, "", "usbmodemd: there are no arguments such as now; see usbmodemd --help\n"},
        {{}, 1, "", "usbmodemd: cannot reach the session bus ("},
    };
    setenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/tmp/nobody", 1);
    for (const auto& run : kRuns) {
        const RunResult result = Usbmodemd(run.arguments);
        SCOPED_TRACE(result.out + result.err);
        EXPECT_EQ(result.status, run.status);
        EXPECT_THAT(result.out, StartsWith(run.out));
        EXPECT_THAT(result.err, StartsWith(run.err));
    }
    PrivateBus bus;
    ModemService first;
    const RunResult second = Usbmodemd({"--foreground"});
    EXPECT_EQ(second.status, 1);
    EXPECT_THAT(second.err, HasSubstr("com.merilond.usbmodem is served by another process"));
}

TEST(Usbmodemd, FollowsPluggingAndUnplugging) {
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "generic,id=0,fault=silent", "--modem",
                              "12d1,id=1,ports=dial/at", "--modem", "2001,id=2,ports=dial/at"});
    simulator.Unplug("2");
    ModemService service;
    // The dead one, first in the list, does not keep those behind it from being served.
    EXPECT_TRUE(service.Lists({"usbmodem1"}));
    simulator.Plug("2");
    EXPECT_TRUE(service.Lists({"usbmodem1", "usbmodem2"}));
    EXPECT_THAT(CallService({"GetUSBModem", "usbmodem1"}).out, HasSubstr("E1752"));
    EXPECT_THAT(CallService({"GetUSBModem", "usbmodem0"}).err,
                HasSubstr("USBModem [usbmodem0] not inited"));
    simulator.Fault("0", "off");
    EXPECT_TRUE(service.Lists({"usbmodem0", "usbmodem1", "usbmodem2"}));
    // Two neighbours at once.
    simulator.Unplug("1");
    simulator.Unplug("2");
    EXPECT_TRUE(service.Lists({"usbmodem0"}));
    simulator.Plug("1");
    EXPECT_TRUE(service.Lists({"usbmodem0", "usbmodem1"}));
    EXPECT_THAT(CallService({"GetUSBModem", "usbmodem1"}).out, HasSubstr("\"signal\": 54"));
    // Unplugged and plugged in faster than anybody looks: the file is there, the port is another.
    simulator.Unplug("1");
    simulator.Plug("1");
    EXPECT_TRUE(service.Lists({"usbmodem0"}));
    EXPECT_TRUE(service.Lists({"usbmodem0", "usbmodem1"}));
    EXPECT_THAT(CallService({"GetUSBModem", "usbmodem1"}).out, HasSubstr("\"signal\": 54"));
}

TEST(Usbmodemd, EndsOnASignalAndReleasesEverything) {
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "12d1,ports=dial/at"});
    for (const int number : {SIGTERM, SIGINT}) {
        ModemService service(LoggingCommand());
        EXPECT_TRUE(service.Says(": usbmodem0 is ready"));
        EXPECT_EQ(service.End(number), 0);
        EXPECT_FALSE(dbus::USBModemClient().IsServerReady());
        EXPECT_TRUE(std::filesystem::is_empty("/var/lock"));
    }
}

TEST(Usbmodemd, LivesWithoutStandardDescriptors) {
    PrivateBus bus;
    for (const char* const closed : {"<&-", "<&- >&- 2>&-"}) {
        SCOPED_TRACE(closed);
        const std::string command = std::string("\"$0\" ") + closed;
        EXPECT_EQ(RunProgram({"sh", "-c", command, BuiltProgram("usbmodemd")}).status, 0);
        EXPECT_EQ(CallService({"GetUSBModemList"}).out, "('',)\n");
        RunProgram({"pkill", "-x", "usbmodemd"});
        while (RunProgram({"pgrep", "-x", "usbmodemd"}).status == 0) {
        }
    }
}

TEST(Usbmodemd, FeedsTheWatchdogOfTheServiceManager) {
    PrivateBus bus;
    sockaddr_un address{AF_UNIX, "/tmp/notify"};
    const UniqueFd manager(socket(AF_UNIX, SOCK_DGRAM, 0));
    ASSERT_EQ(bind(manager.Get(), reinterpret_cast<sockaddr*>(&address), sizeof address), 0);
    ModemService service({"env", std::string("NOTIFY_SOCKET=") + address.sun_path,
                          "WATCHDOG_USEC=100000", BuiltProgram("usbmodemd"), "-f"});
    for (int i = 0; i < 3; ++i) {
        char text[32];
        const ssize_t length = recv(manager.Get(), text, sizeof text, 0);
        ASSERT_GT(length, 0);
        EXPECT_EQ(std::string(text, static_cast<size_t>(length)), "WATCHDOG=1");
    }
}

// The most processes that look for a modem's ports at the same time, until all have looked once.
TEST(Usbmodemd, LooksForFewModemsAtATime) {
    constexpr int kModems = 20;
    std::vector<std::string> modems;
    for (int i = 0; i < kModems; ++i) {
        modems.insert(modems.end(), {"--modem", "generic,ports=dial/mute,fault=silent"});
    }
    PrivateBus bus;
    ModemSimulator simulator(modems);
    ModemService service(LoggingCommand());
    const std::string pid = std::to_string(service.Daemon().Pid());
    const std::string list = "/proc/" + pid + "/task/" + pid + "/children";
    std::ptrdiff_t most = 0;
    for (int left = kModems; left > 0;) {
        const auto line = service.Daemon().ReadLine(std::chrono::milliseconds(50));
        ASSERT_FALSE(service.Daemon().AtEnd());
        left -= line && line->find("does not answer; next try in 2 s") != std::string::npos;
        std::istringstream children(ReadFile(list));
        using Words = std::istream_iterator<std::string>;
        most = std::max(most, std::distance(Words(children), Words()));
    }
    EXPECT_EQ(most, 16);
}

}  // namespace
}  // namespace taviwireless::test
