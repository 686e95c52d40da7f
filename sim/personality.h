// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_PERSONALITY_H
#define TAVIWIRELESS_SIM_PERSONALITY_H

#include <map>
#include <string>
#include <vector>

#include "sim/sim_card.h"

namespace taviwireless::sim {

// What a command does beyond its reply.
enum class Effect { kNone, kReset, kDial, kHangUp, kEnterPin, kChangePin, kSetLock };

struct CommandRule {
    std::vector<std::string> reply;  // lines before OK, with {placeholders}
    SimNeed needs = SimNeed::kNothing;
    Effect effect = Effect::kNone;
    // Variables that the command sets, each to the argument of that number (from 1) ...
    std::map<std::string, size_t> setToArgument;
    std::map<std::string, std::string> setToText;  // ... or to this text
};

struct ErrorText {
    int code;
    std::string text;
};

enum class PortRole { kDial, kAt, kMute };
const char* RoleName(PortRole role);
// Throws std::invalid_argument for a word that names no role.
PortRole ParseRole(const std::string& word);

// What one kind of modem answers: data read from a JSON file, in which "extends" names the
// personality whose entries it takes over unless it replaces them (null removes one).
class Personality {
  public:
    // `name` is that of a personality that comes with this program, or a path (it holds a "/").
    // Throws std::invalid_argument with words that name the file and the place in it.
    static Personality Load(const std::string& name);

    // The names of those that come with this program.
    static std::vector<std::string> Known();

    // The rule for a command: the one with just this text, else the longest pattern that matches.
    // Asking a known command for its values ("AT+CPIN=?") needs no rule of its own.
    const CommandRule* Find(const std::string& command) const;

    std::string vendorId;
    std::vector<PortRole> ports;
    std::map<std::string, std::string> variables;
    std::map<std::string, ErrorText> errors;
    std::map<std::string, CommandRule> rules;
};

// Placeholders that come from the modem's state rather than from a variable.
extern const std::vector<std::string> kComputedPlaceholders;

}  // namespace taviwireless::sim

#endif
