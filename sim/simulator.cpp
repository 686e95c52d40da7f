// SPDX-License-Identifier: MIT
#include "sim/simulator.h"

#include <poll.h>

#include <algorithm>
#include <cerrno>
#include <optional>
#include <stdexcept>

namespace taviwireless::sim {

bool Simulator::HasId(unsigned id) const {
    return std::any_of(modems_.begin(), modems_.end(),
                       [id](const auto& modem) { return modem->Id() == id; });
}

SimulatedModem& Simulator::Add(const ModemDescription& description) {
    unsigned id = description.id.value_or(0);
    if (description.id && HasId(id)) {
        throw std::invalid_argument("two modems have the id " + std::to_string(id));
    }
    while (HasId(id)) {
        ++id;
    }
    modems_.push_back(
        std::make_unique<SimulatedModem>(id, description, places_, watch_, transcript_));
    return *modems_.back();
}

SimulatedModem& Simulator::Find(unsigned id) {
    for (const auto& modem : modems_) {
        if (modem->Id() == id) {
            return *modem;
        }
    }
    throw std::invalid_argument("there is no modem " + std::to_string(id));
}

void Simulator::Work() {
    for (const auto& modem : modems_) {
        modem->Work(Clock::now());
    }
}

int Simulator::Timeout() const {
    if (watch_.HasNews()) {
        return 0;
    }
    std::optional<Clock::time_point> next;
    for (const auto& modem : modems_) {
        const auto due = modem->NextDue();
        if (due && (!next || *due < *next)) {
            next = due;
        }
    }
    if (!next) {
        return -1;
    }
    const auto left = std::chrono::ceil<Milliseconds>(*next - Clock::now());
    return static_cast<int>(std::max<Milliseconds::rep>(0, left.count()));
}

bool Simulator::ServeUntil(int extra, int stop) {
    for (;;) {
        std::vector<pollfd> ready = {
            {extra, POLLIN, 0}, {stop, POLLIN, 0}, {watch_.Get(), POLLIN, 0}};
        for (const auto& modem : modems_) {
            for (const Port& port : modem->Ports()) {
                if (port.Line() != nullptr && port.Line()->HasClient()) {
                    const short events = port.IsBlocked() ? POLLIN | POLLOUT : POLLIN;
                    ready.push_back({port.Awaited(), events, 0});
                }
            }
        }
        if (poll(ready.data(), ready.size(), Timeout()) < 0 && errno != EINTR) {
            throw std::runtime_error("Cannot wait for the ports (poll).");
        }
        Work();
        if (ready[1].revents != 0) {
            return false;
        }
        if (ready[0].revents != 0) {
            return true;
        }
    }
}

}  // namespace taviwireless::sim
