// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_MODEM_DESCRIPTION_H
#define TAVIWIRELESS_SIM_MODEM_DESCRIPTION_H

#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "sim/personality.h"

namespace taviwireless::sim {

// A modem as the command line describes it: PERSONALITY[,NAME=VALUE]...
struct ModemDescription {
    std::string personality;
    std::optional<unsigned> id;     // nothing: the next free one
    std::string ports;              // empty: the personality's
    std::vector<std::string> ttys;  // empty: pseudo-terminals
    std::string onDial;             // a command; empty: nobody is at the far end
    std::vector<std::string> faults;
    std::vector<std::pair<std::string, std::string>> settings;  // for Modem::Set, in order
};

// Throws std::invalid_argument with a sentence.
ModemDescription ParseModemDescription(const std::string& text);

// The ports that `wanted` gives a modem whose personality has `usual`: empty for those, a number
// for that many of them and more that answer AT, or roles with a "/" between them (dial/mute/at).
std::vector<PortRole> ChoosePorts(const std::string& wanted, const std::vector<PortRole>& usual);

}  // namespace taviwireless::sim

#endif
