// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_SURROUNDINGS_H
#define TAVIWIRELESS_TESTS_SUPPORT_SURROUNDINGS_H

#include <taviwireless/usbmodem.h>

#include <chrono>
#include <functional>
#include <optional>
#include <string>

#include "tests/support/bus.h"
#include "tests/wireless/station_fixture.h"

namespace taviwireless::test {

// What has to be around a call of a public function. For tests in an appliance root.
enum class Needs {
    kNothing,
    kModem,             // modem 1, and a record of it that is initialised
    kConnection,        // the same with a dialler that runs and a link that is up
    kPlugged,           // modem 1, of which this process knows nothing yet
    kDialled,           // the same with a dialler of another process
    kService,           // usbmodemd on a bus of its own, with modem 1
    kServedConnection,  // the same, connected
    kAdapter,           // the Wi-Fi adapter, a network in range, saved; settings of an access point
    kJoined,            // the same, connected to that network
    kAccessPoint,       // the same, as an access point that is on
};

constexpr Needs kAllNeeds[] = {Needs::kNothing,          Needs::kModem,   Needs::kConnection,
                               Needs::kPlugged,          Needs::kDialled, Needs::kService,
                               Needs::kServedConnection, Needs::kAdapter, Needs::kJoined,
                               Needs::kAccessPoint};

constexpr char kReadySim[] = "lock on";  // its PIN was entered before

// Made once for all calls that need the same. The library's connection to the bus is not used here,
// so that a forked child has one of its own.
class Surroundings {
  public:
    explicit Surroundings(Needs needs);
    ~Surroundings();

    // Makes files, processes and the SIM as they were at the start, quickly; `sim` is a setting of
    // the simulator. What a call leaves in the memory of this process stays: see InChild.
    void Arrange(const std::string& sim = kReadySim);

    usbmodem_lib::USBModem& Modem() { return *modem_; }
    Station& Adapter() { return *station_; }
    ModemSimulator& Simulator() { return *simulator_; }
    Process* Service() { return service_ ? &*service_ : nullptr; }

  private:
    const Needs needs_;
    std::optional<PrivateBus> bus_;
    std::optional<ModemSimulator> simulator_;
    std::optional<Process> service_;
    std::optional<usbmodem_lib::USBModem> modem_;
    std::optional<Station> station_;
};

struct ChildResult {
    std::string text;  // what the call returned
    int status;        // 0, or N when signal N ended it: SIGKILL when the time was over
};

// Calls in a forked child, so that this process stays as it is.
ChildResult InChild(const std::function<std::string()>& call,
                    std::chrono::milliseconds patience = Process::kPatience);

}  // namespace taviwireless::test

#endif
