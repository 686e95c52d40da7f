// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_SIMULATED_MODEM_H
#define TAVIWIRELESS_SIM_SIMULATED_MODEM_H

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "sim/modem.h"
#include "sim/modem_description.h"
#include "sim/port.h"

namespace taviwireless::sim {

// Where the world sees the modems.
struct Places {
    std::string linkDir;  // empty: no links
    std::string infoDir;  // empty: no info files
    unsigned firstPort = 0;
};

// A modem with its ports, their links and the info file that names them: what plugging in and
// unplugging act on.
class SimulatedModem {
  public:
    // Throws std::invalid_argument or std::runtime_error with a sentence.
    SimulatedModem(unsigned id, const ModemDescription& description, const Places& places,
                   OpenWatch& watch, Transcript& transcript);
    ~SimulatedModem() { RemoveInfo(); }

    unsigned Id() const { return id_; }
    Modem& Core() { return modem_; }
    std::vector<Port>& Ports() { return ports_; }

    // Plugs in every port that is not, with a fresh line under its old name, or just that port.
    void Plug(std::optional<size_t> port = {});
    // Unplugs the whole modem, which loses power and info file, or just that port.
    void Unplug(std::optional<size_t> port = {});

    // Serves the ports that are plugged in.
    void Work(Clock::time_point now);

    // When Work is to be called again even if nothing arrives; nothing: not before.
    std::optional<Clock::time_point> NextDue() const;

    // One line per port: "modem 0 port 2 at /dev/pts/7 /dev/ttyUSB2", or "unplugged".
    std::string Describe() const;

  private:
    void PlugPort(size_t index);
    void NumberPorts();
    void HangUp(Clock::time_point now);
    void Reopen(Clock::time_point now);
    void WriteInfo();
    void RemoveInfo();
    std::string Link(size_t index) const;

    unsigned id_;
    const Places& places_;
    OpenWatch& watch_;
    std::vector<std::string> ttys_;
    Modem modem_;
    std::vector<Port> ports_;
    std::vector<unsigned> numbers_;  // k of ttyUSBk, per port
    std::string infoPath_;           // of the file that is there; empty: none
    std::vector<size_t> hungUp_;     // ports whose given tty is to be opened again
    Clock::time_point reopenAt_;
};

}  // namespace taviwireless::sim

#endif
