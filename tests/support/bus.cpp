// SPDX-License-Identifier: MIT
#include "tests/support/bus.h"

#include <taviwireless/usbmodem_client.h>

#include <csignal>
#include <cstdlib>
#include <stdexcept>

#include "tests/support/files.h"
#include "tests/support/wait.h"

namespace taviwireless::test {

std::vector<std::string> LoggingCommand() {
    return WithShortWaits({"sh", "-c", "exec \"$0\" --foreground 2>&1", BuiltProgram("usbmodemd")});
}

PrivateBus::PrivateBus() {
    WriteFile("/tmp/bus.conf", R"(<busconfig><type>session</type>
        <listen>unix:path=/tmp/bus</listen><auth>EXTERNAL</auth><policy context="default">
        <allow send_destination="*" eavesdrop="true"/><allow eavesdrop="true"/><allow own="*"/>
        </policy><limit name="max_message_size">1000000000</limit>
        <limit name="max_incoming_bytes">1000000000</limit>
        <limit name="max_outgoing_bytes">1000000000</limit>
        <limit name="max_replies_per_connection">50000</limit></busconfig>)");
    setenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/tmp/bus", 1);
    Restart();
}

void PrivateBus::Restart() {
    if (daemon_) {
        daemon_->Signal(SIGTERM);
        daemon_->Wait();
    }
    const std::vector<std::string> command = {"dbus-daemon", "--config-file=/tmp/bus.conf",
                                              "--nofork", "--nopidfile", "--print-address=1"};
    if (!daemon_.emplace(command).ReadLine()) {
        throw std::runtime_error("dbus-daemon did not start");
    }
}

ModemService::ModemService(const std::vector<std::string>& command)
    : process_(command.empty() ? WithShortWaits({BuiltProgram("usbmodemd"), "--foreground"})
                               : command) {
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

namespace {

// A D-Bus client, which prints all letters wherever the tests run.
RunResult Call(const std::vector<std::string>& words) {
    std::vector<std::string> command = {"env", "LC_ALL=C.UTF-8", "gdbus", "call", "--session"};
    command.insert(command.end(), words.begin(), words.end());
    return RunProgram(command);
}

}  // namespace

RunResult CallService(std::vector<std::string> methodAndArguments) {
    methodAndArguments[0] = "com.merilond.usbmodem." + methodAndArguments[0];
    std::vector<std::string> words = {"-d", "com.merilond.usbmodem", "-o", "/", "-m"};
    words.insert(words.end(), methodAndArguments.begin(), methodAndArguments.end());
    return Call(words);
}

RunResult CallObject(const std::string& path, const std::string& method) {
    return Call({"-d", "com.merilond.usbmodem.Objects", "-o", "/com/merilond/usbmodem" + path, "-m",
                 method});
}

}  // namespace taviwireless::test
