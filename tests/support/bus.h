// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_BUS_H
#define TAVIWIRELESS_TESTS_SUPPORT_BUS_H

#include <gmock/gmock.h>

#include <optional>
#include <string>
#include <vector>

#include "tests/support/modem_simulator.h"
#include "tests/support/process.h"

namespace taviwireless::test {

// A dbus-daemon of the test's own as session bus, of this process and of those it starts. For tests
// in an appliance root.
class PrivateBus {
  public:
    PrivateBus();  // returns when the bus can be reached
    ~PrivateBus() { unsetenv("DBUS_SESSION_BUS_ADDRESS"); }

    // Ends it, and starts another at the same address.
    void Restart();

  private:
    std::optional<Process> daemon_;
};

// The command of usbmodemd with short waits, and with its log on its standard output.
std::vector<std::string> LoggingCommand();

// usbmodemd beside the test, on the bus there is.
class ModemService {
  public:
    // Returns once the service owns its name. The command is usbmodemd with short waits, if none is
    // given.
    explicit ModemService(const std::vector<std::string>& command = {});

    // Waits until the service lists exactly these modems, and returns whether it ever does.
    bool Lists(const std::vector<std::string>& devids);

    // Of one with its log on its standard output: reads on until a line holds this; false when
    // there is none. The lines that were read.
    bool Says(const std::string& text);
    const std::string& Log() const { return log_; }

    // Ends it as a person does, and returns its exit status.
    int End(int signal = SIGTERM);

    Process& Daemon() { return process_; }

  private:
    Process process_;
    std::string log_;
};

// A bus, modems, and a service that is ready with them.
struct ServedModems {
    explicit ServedModems(const std::string& modem, const std::vector<std::string>& command = {})
        : ServedModems({"--modem", modem}, {"usbmodem0"}, command) {}
    ServedModems(const std::vector<std::string>& modems, const std::vector<std::string>& ids,
                 const std::vector<std::string>& command = {})
        : simulator(modems), service(command) {
        EXPECT_TRUE(service.Lists(ids));
    }

    PrivateBus bus;
    ModemSimulator simulator;
    ModemService service;
};

// The result of a D-Bus method of the modem service, called by a program that we did not write
// (gdbus): what it prints.
RunResult CallService(std::vector<std::string> methodAndArguments);

// Likewise that of a method, with its interface, of the manager (path "") or of a modem ("/" and
// its id).
RunResult CallObject(const std::string& path, const std::string& method);

}  // namespace taviwireless::test

#endif
