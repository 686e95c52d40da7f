// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_SIMULATOR_H
#define TAVIWIRELESS_SIM_SIMULATOR_H

#include <memory>
#include <string>
#include <vector>

#include "sim/simulated_modem.h"

namespace taviwireless::sim {

// All modems of this program and the loop that keeps them answering.
class Simulator {
  public:
    Simulator(Places places, Transcript transcript)
        : places_(std::move(places)), transcript_(std::move(transcript)) {}

    // Throws std::invalid_argument or std::runtime_error with a sentence.
    SimulatedModem& Add(const ModemDescription& description);

    // Throws std::invalid_argument when there is no such modem.
    SimulatedModem& Find(unsigned id);
    const std::vector<std::unique_ptr<SimulatedModem>>& Modems() const { return modems_; }

    // Serves the modems until `extra` (negative: none) or `stop` can be read. True for `extra`.
    bool ServeUntil(int extra, int stop);

  private:
    bool HasId(unsigned id) const;
    void Work();
    int Timeout() const;

    Places places_;
    Transcript transcript_;
    OpenWatch watch_;
    std::vector<std::unique_ptr<SimulatedModem>> modems_;
};

}  // namespace taviwireless::sim

#endif
