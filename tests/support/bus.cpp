#include "tests/support/bus.h"

#include <taviwireless/usbmodem_client.h>

#include <csignal>
#include <cstdlib>
#include <stdexcept>

#include "tests/support/files.h"
#include "tests/support/wait.h"

namespace taviwireless::test {

namespace {

constexpr char kConfigFile[] = "/tmp/session-bus.conf";
constexpr char kAddress[] = "unix:path=/tmp/session-bus";

std::vector<std::string> DaemonCommand(const std::vector<std::string>& command) {
    return command.empty() ? WithShortWaits({BuiltProgram("usbmodemd"), "--foreground"}) : command;
}

}  // namespace

std::vector<std::string> LoggingCommand() {
    return WithShortWaits({"sh", "-c", "exec \"$0\" --foreground 2>&1", BuiltProgram("usbmodemd")});
}

PrivateBus::PrivateBus(const std::string& config) {
    WriteFile(kConfigFile,
              std::string("<busconfig><type>session</type><listen>") + kAddress +
                  "</listen><auth>EXTERNAL</auth><policy context=\"default\">"
                  "<allow send_destination=\"*\" eavesdrop=\"true\"/><allow eavesdrop=\"true\"/>"
                  "<allow own=\"*\"/>"
                  "</policy>" +
                  config + "</busconfig>");
    setenv("DBUS_SESSION_BUS_ADDRESS", kAddress, 1);
    Start();
}

PrivateBus::~PrivateBus() {
    Stop();
    unsetenv("DBUS_SESSION_BUS_ADDRESS");
}

void PrivateBus::Start() {
    daemon_.emplace(std::vector<std::string>{"dbus-daemon",
                                             std::string("--config-file=") + kConfigFile,
                                             "--nofork", "--nopidfile", "--print-address=1"});
    if (!daemon_->ReadLine()) {
        throw std::runtime_error("dbus-daemon did not start");
    }
}

void PrivateBus::Stop() {
    if (daemon_) {
        daemon_->Signal(SIGTERM);
        daemon_->Wait();
        daemon_.reset();
    }
}

void PrivateBus::Restart() {
    Stop();
    Start();
}

ModemService::ModemService(const std::vector<std::string>& command)
    : process_(DaemonCommand(command)) {
    if (!Eventually([] { return dbus::USBModemClient().IsServerReady(); })) {
        throw std::runtime_error("usbmodemd does not own its name");
    }
}

bool ModemService::Lists(const std::vector<std::string>& devids) {
    std::string expected;
    for (const std::string& devid : devids) {
        expected += devid + '\n';
    }
    return Eventually([&expected] {
        std::string list;
        return dbus::USBModemClient().GetUSBModemList(list) == 0 && list == expected;
    });
}

bool ModemService::Says(const std::string& text) {
    while (const auto line = process_.ReadLine()) {
        log_ += *line + '\n';
        if (line->find(text) != std::string::npos) {
            return true;
        }
    }
    return false;
}

int ModemService::End(int signal) {
    process_.Signal(signal);
    return process_.Wait().value_or(-1);
}

RunResult CallService(std::vector<std::string> methodAndArguments) {
    methodAndArguments[0] = "com.merilond.usbmodem." + methodAndArguments[0];
    std::vector<std::string> command = {"gdbus", "call", "--session", "-d", "com.merilond.usbmodem",
                                        "-o",    "/",    "-m"};
    command.insert(command.end(), methodAndArguments.begin(), methodAndArguments.end());
    return RunProgram(command);
}

}  // namespace taviwireless::test
