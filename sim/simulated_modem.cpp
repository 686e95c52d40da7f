// SPDX-License-Identifier: MIT
#include "sim/simulated_modem.h"

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <stdexcept>

#include "base/join.h"

namespace taviwireless::sim {

namespace fs = std::filesystem;

namespace {

// A USB gadget's tty is hung up when its host goes away, and can be opened again at once or later.
constexpr Milliseconds kReopenPause{200};

}  // namespace

SimulatedModem::SimulatedModem(unsigned id, const ModemDescription& description,
                               const Places& places, OpenWatch& watch, Transcript& transcript)
    : id_(id),
      places_(places),
      watch_(watch),
      ttys_(description.ttys),
      modem_(Personality::Load(description.personality)) {
    for (const auto& [name, value] : description.settings) {
        modem_.Set(name, value);
    }
    auto roles = ChoosePorts(description.ports, modem_.Kind().ports);
    if (!ttys_.empty()) {
        // Given ttys all answer, unless roles were given for them.
        roles =
            description.ports.empty() ? std::vector<PortRole>(ttys_.size(), PortRole::kAt) : roles;
        if (roles.size() != ttys_.size()) {
            throw std::invalid_argument("the modem has " + std::to_string(roles.size()) +
                                        " ports, but " + std::to_string(ttys_.size()) +
                                        " ttys are given for it");
        }
    }
    for (size_t index = 0; index < roles.size(); ++index) {
        const std::string name = std::to_string(id) + "." + std::to_string(index);
        ports_.emplace_back(modem_, roles[index], name, description.onDial, transcript);
        for (const auto& fault : description.faults) {
            ports_.back().faults.Add(fault);
        }
    }
    NumberPorts();
    Plug();
}

// The first free numbers. A link that leads nowhere is what a killed simulator left: free.
void SimulatedModem::NumberPorts() {
    unsigned number = places_.firstPort;
    while (numbers_.size() < ports_.size()) {
        std::error_code ignored;
        const fs::path link = fs::path(places_.linkDir) / ("ttyUSB" + std::to_string(number));
        if (places_.linkDir.empty() || !fs::exists(link, ignored)) {
            numbers_.push_back(number);
        }
        ++number;
    }
}

std::string SimulatedModem::Link(size_t index) const {
    if (places_.linkDir.empty() || !ttys_.empty()) {
        return "";
    }
    return fs::path(places_.linkDir) / ("ttyUSB" + std::to_string(numbers_[index]));
}

void SimulatedModem::PlugPort(size_t index) {
    if (ports_[index].Line() == nullptr) {
        const std::string tty = ttys_.empty() ? "" : ttys_[index];
        ports_[index].Plug(std::make_unique<SerialLine>(tty, Link(index), watch_));
    }
}

void SimulatedModem::Plug(std::optional<size_t> port) {
    if (port) {
        PlugPort(*port);
        return;
    }
    for (size_t index = 0; index < ports_.size(); ++index) {
        PlugPort(index);
    }
    WriteInfo();
}

void SimulatedModem::Unplug(std::optional<size_t> port) {
    hungUp_.clear();
    if (port) {
        ports_[*port].Unplug();
        return;
    }
    RemoveInfo();
    for (Port& each : ports_) {
        each.Unplug();
    }
    modem_.PowerCycle();
}

void SimulatedModem::Work(Clock::time_point now) {
    Reopen(now);
    for (size_t index = 0; index < ports_.size(); ++index) {
        if (ports_[index].Line() == nullptr) {
            continue;
        }
        switch (ports_[index].Work(now)) {
            case Port::Outcome::kServed:
                break;
            case Port::Outcome::kHungUp:
                HangUp(now);
                return;
            case Port::Outcome::kVanishes:
                Unplug();
                return;
        }
    }
}

// The ttys of a USB gadget are hung up together, but the call of a port may be late to notice.
void SimulatedModem::HangUp(Clock::time_point now) {
    hungUp_.clear();
    for (size_t index = 0; index < ports_.size(); ++index) {
        ports_[index].Unplug();
        hungUp_.push_back(index);
    }
    modem_.PowerCycle();
    reopenAt_ = now + kReopenPause;
}

void SimulatedModem::Reopen(Clock::time_point now) {
    if (hungUp_.empty() || now < reopenAt_) {
        return;
    }
    reopenAt_ = now + kReopenPause;
    for (const size_t index : std::exchange(hungUp_, {})) {
        try {
            PlugPort(index);
        } catch (const std::runtime_error&) {
            hungUp_.push_back(index);
        }
    }
}

std::optional<Clock::time_point> SimulatedModem::NextDue() const {
    std::optional<Clock::time_point> next;
    if (!hungUp_.empty()) {
        next = reopenAt_;
    }
    for (const Port& port : ports_) {
        const auto due = port.NextDue();
        if (due && (!next || *due < *next)) {
            next = due;
        }
    }
    return next;
}

// The name under which the file is written must not begin like an info file's, or a reader could
// take up a half-written one.
void SimulatedModem::WriteInfo() {
    if (places_.infoDir.empty() || !ttys_.empty()) {
        return;
    }
    std::string dial;
    std::string all;
    for (size_t index = 0; index < ports_.size(); ++index) {
        const std::string number = std::to_string(numbers_[index]);
        AddItem(all, number, ",");
        if (ports_[index].Role() == PortRole::kDial) {
            dial = number;
        }
    }
    const fs::path path = fs::path(places_.infoDir) / ("usbmodem.info" + std::to_string(id_));
    const fs::path draft = fs::path(places_.infoDir) / (".modemsim.info" + std::to_string(id_));
    std::ofstream file(draft);
    file << "USB_ID_VENDOR=" << modem_.Kind().vendorId << "\nCONNECTNODE=" << dial
         << "\nDEVICENODE=" << all << "\n";
    file.close();
    std::error_code error;
    fs::rename(draft, path, error);
    if (!file || error) {
        throw std::runtime_error("Cannot write the info file " + path.string() +
                                 "; is its folder there and writable?");
    }
    infoPath_ = path;
}

void SimulatedModem::RemoveInfo() {
    if (!infoPath_.empty()) {
        std::remove(infoPath_.c_str());
        infoPath_.clear();
    }
}

std::string SimulatedModem::Describe() const {
    std::string text;
    for (size_t index = 0; index < ports_.size(); ++index) {
        const Port& port = ports_[index];
        text += "modem " + std::to_string(id_) + " port " + std::to_string(index) + " " +
                RoleName(port.Role()) + " ";
        if (port.Line() == nullptr) {
            text += "unplugged\n";
            continue;
        }
        const std::string link = Link(index);
        text += port.Line()->Path() + (link.empty() ? "" : " " + link) + "\n";
    }
    return text;
}

}  // namespace taviwireless::sim
