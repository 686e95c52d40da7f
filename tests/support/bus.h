#ifndef TAVIWIRELESS_TESTS_SUPPORT_BUS_H
#define TAVIWIRELESS_TESTS_SUPPORT_BUS_H

#include <optional>
#include <string>
#include <vector>

#include "tests/support/process.h"

namespace taviwireless::test {

// A dbus-daemon of the test's own as session bus, of this process and of those it starts. For tests
// in an appliance root.
class PrivateBus {
  public:
    // Returns when the bus can be reached. `config` is added to its configuration.
    explicit PrivateBus(const std::string& config = "");
    ~PrivateBus();

    // As if the bus was restarted: ends it, and starts another at the same address.
    void Restart();
    void Stop();

  private:
    void Start();

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

    Process& Daemon() { return process_; }

  private:
    Process process_;
};

// The result of a D-Bus method of the modem service, called by a program that we did not write
// (gdbus): what it prints.
RunResult CallService(std::vector<std::string> methodAndArguments);

}  // namespace taviwireless::test

#endif
