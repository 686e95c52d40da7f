// usbmodemd on a real bus: starting, the modems it serves, ending.
#include <gmock/gmock.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <taviwireless/usbmodem_client.h>

#include <filesystem>
#include <thread>

#include "base/unique_fd.h"
#include "tests/support/bus.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::IsEmpty;
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

TEST(Usbmodemd, IntrospectionListsTheTenMethodsAndTheirArguments) {
    PrivateBus bus;
    ModemService service;
    const std::string xml = RunProgram({"gdbus", "introspect", "--xml", "--session", "-d",
                                        "com.merilond.usbmodem", "-o", "/"})
                                .out;
    const std::string ours = xml.substr(xml.find("<interface name=\"com.merilond.usbmodem\">"));
    const struct {
        const char* name;
        const char* arguments;  // ">" and "<" tell in from out
    } kMethods[] = {{"Connect", ">devid:s"},
                    {"Disconnect", ">devid:s"},
                    {"GetUSBModemList", "<usbmodem_list:s"},
                    {"GetUSBModem", ">devid:s<usbmodem:s"},
                    {"UnlockSIM", ">devid:s>pin:s"},
                    {"SetPIN", ">devid:s>oldpin:s>newpin:s>protection:b"},
                    {"GetProfile", ">devid:s<profile:s"},
                    {"SetProfile", ">devid:s>profile:s"},
                    {"UnlockPIN", ">devid:s>puk:s>pin:s"},
                    {"GetUSBModemIfList", "<usbmodem_if_list:s"}};
    const auto attribute = [](const std::string& element, const std::string& name) {
        const size_t begin = element.find(name + "=\"") + name.size() + 2;
        return element.substr(begin, element.find('"', begin) - begin);
    };
    std::map<std::string, std::string> methods;
    std::string method;
    std::istringstream lines(ours);
    for (std::string line; std::getline(lines, line);) {
        if (line.find("<method ") != std::string::npos) {
            method = attribute(line, "name");
            methods[method];
        } else if (line.find("<arg ") != std::string::npos) {
            methods[method] += (attribute(line, "direction") == "in" ? ">" : "<") +
                               attribute(line, "name") + ":" + attribute(line, "type");
        }
    }
    EXPECT_EQ(methods.size(), std::size(kMethods));
    for (const auto& expected : kMethods) {
        EXPECT_EQ(methods[expected.name], expected.arguments) << expected.name;
    }
    EXPECT_THAT(ours, testing::Not(HasSubstr("<signal ")));
    EXPECT_THAT(ours, testing::Not(HasSubstr("<property ")));
}

TEST(Usbmodemd, FollowsPluggingAndUnplugging) {
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "generic,id=0,fault=silent", "--modem",
                              "12d1,id=1,ports=dial/at", "--modem", "2001,id=2,ports=dial/at"});
    ModemService service;
    // The dead one, first in the list, does not keep those behind it from being served.
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
        ASSERT_TRUE(service.Lists({"usbmodem0"}));
        service.Daemon().Signal(number);
        EXPECT_EQ(service.Daemon().Wait(), 0);
        std::string log;
        while (const auto line = service.Daemon().ReadLine()) {
            log += *line + '\n';
        }
        EXPECT_THAT(log, HasSubstr(": usbmodem0 is ready\n"));
        EXPECT_FALSE(dbus::USBModemClient().IsServerReady());
        EXPECT_TRUE(std::filesystem::is_empty("/var/lock"));
    }
}

TEST(Usbmodemd, WithoutForegroundGoesToTheBackgroundOnceItServes) {
    PrivateBus bus;
    const RunResult first = Usbmodemd({});
    EXPECT_EQ(first.status, 0);
    EXPECT_EQ(first.err, "");
    EXPECT_TRUE(dbus::USBModemClient().IsServerReady());
    EXPECT_EQ(Usbmodemd({}).status, 1);
    RunProgram({"pkill", "-x", "usbmodemd"});
}

TEST(Usbmodemd, IsStartedByTheFirstCall) {
    WriteFile("/tmp/services/usbmodem.service",
              "[D-BUS Service]\nName=com.merilond.usbmodem\nExec='" + BuiltProgram("usbmodemd") +
                  "' --foreground\n");
    PrivateBus bus("<servicedir>/tmp/services</servicedir>");
    EXPECT_EQ(CallService({"GetUSBModemList"}).out, "('',)\n");
    RunProgram({"pkill", "-x", "usbmodemd"});
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
    constexpr int kModems = 8;
    std::vector<std::string> modems;
    for (int i = 0; i < kModems; ++i) {
        modems.insert(modems.end(), {"--modem", "generic,ports=dial/mute,fault=silent"});
    }
    PrivateBus bus;
    ModemSimulator simulator(modems);
    ModemService service(LoggingCommand());
    int most = 0;
    for (int left = kModems; left > 0;) {
        const auto line = service.Daemon().ReadLine(std::chrono::milliseconds(50));
        ASSERT_FALSE(service.Daemon().AtEnd());
        left -= line && line->find("does not answer; next try in 2 s") != std::string::npos;
        most = std::max(most, std::stoi(RunProgram({"pgrep", "-cf", "exe --probe "}).out));
    }
    EXPECT_GT(most, 1);
    EXPECT_LT(most, kModems);  // four, and those that are just ending
}

TEST(Usbmodemd, FindsAQueryPortBehindFourteenSilentOnes) {
    std::string ports = "dial";
    for (int i = 0; i < 14; ++i) {
        ports += "/mute";
    }
    ModemSimulator simulator({"--modem", "generic,ports=" + ports + "/at"});
    const RunResult probe = Usbmodemd({"--probe", "0"});
    EXPECT_EQ(probe.status, 0);
    EXPECT_EQ(probe.out, "/dev/ttyUSB15");
    EXPECT_TRUE(std::filesystem::is_empty("/var/lock"));
}

}  // namespace
}  // namespace taviwireless::test
