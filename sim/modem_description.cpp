// SPDX-License-Identifier: MIT
#include "sim/modem_description.h"

#include <stdexcept>

#include "base/split.h"
#include "sim/user_text.h"

namespace taviwireless::sim {
namespace {

constexpr unsigned kMostPorts = 16;

void Apply(const std::string& name, const std::string& value, ModemDescription* description) {
    if (name == "id") {
        description->id = ParseNumber(value, name);
    } else if (name == "ports") {
        description->ports = value;
    } else if (name == "fault") {
        description->faults.push_back(value);
    } else if (name == "pin") {
        // A card with a PIN of its own is one that asks for it; a later lock=off takes that back.
        description->settings.emplace_back(name, value);
        description->settings.emplace_back("lock", "on");
    } else {
        description->settings.emplace_back(name == "attempts" ? "pin_attempts" : name, value);
    }
}

}  // namespace

ModemDescription ParseModemDescription(const std::string& text) {
    ModemDescription description;
    for (const auto& part : Split(text, ',')) {
        const size_t equals = part.find('=');
        if (equals != std::string::npos) {
            Apply(part.substr(0, equals), part.substr(equals + 1), &description);
        } else if (description.personality.empty()) {
            description.personality = part;
        } else {
            throw std::invalid_argument("'" + part + "' has no value; write " + part + "=VALUE");
        }
    }
    if (description.personality.empty()) {
        description.personality = "generic";
    }
    return description;
}

std::vector<PortRole> ChoosePorts(const std::string& wanted, const std::vector<PortRole>& usual) {
    if (wanted.empty()) {
        return usual;
    }
    std::vector<PortRole> ports;
    if (wanted.find_first_not_of("0123456789") != std::string::npos) {
        for (const auto& word : Split(wanted, '/')) {
            ports.push_back(ParseRole(word));
        }
        return ports;
    }
    const unsigned count = ParseNumber(wanted, "ports");
    if (count < 1 || count > kMostPorts) {
        throw std::invalid_argument("a modem has 1 to 16 ports, not " + wanted);
    }
    ports = usual;
    ports.resize(count, PortRole::kAt);
    return ports;
}

}  // namespace taviwireless::sim
