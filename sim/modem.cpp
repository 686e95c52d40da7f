// SPDX-License-Identifier: MIT
#include "sim/modem.h"

#include <algorithm>
#include <stdexcept>

#include "sim/at_text.h"

namespace taviwireless::sim {
namespace {

constexpr char kUnknownCommand[] = "unknown_command";

// The argument of that number, from 1; empty when there are fewer.
std::string Argument(const std::vector<std::string>& arguments, size_t number) {
    return number <= arguments.size() ? arguments[number - 1] : "";
}

}  // namespace

Reply Modem::Answer(const std::string& line) {
    Reply reply;
    const std::string normalised = Normalise(line);
    if (normalised.compare(0, 2, "AT") != 0) {
        reply.result.clear();
        return reply;
    }
    if (TakeOverride(normalised, &reply)) {
        return reply;
    }
    for (const auto& command : SplitCommands(normalised)) {
        const std::string error = Execute(command, &reply);
        if (!error.empty()) {
            reply.result = Render(error);
            break;
        }
    }
    return reply;
}

bool Modem::TakeOverride(const std::string& line, Reply* reply) {
    const auto found = std::find_if(overrides_.begin(), overrides_.end(), [&](const auto& entry) {
        return MatchesPattern(entry.pattern, line);
    });
    if (found == overrides_.end()) {
        return false;
    }
    reply->isRaw = true;
    reply->lines = {found->text};
    reply->result.clear();
    if (found->once) {
        overrides_.erase(found);
    }
    return true;
}

std::string Modem::Execute(const std::string& command, Reply* reply) {
    const CommandRule* rule = personality_.Find(command);
    if (rule == nullptr) {
        return kUnknownCommand;
    }
    std::string error = sim_.Missing(rule->needs);
    if (!error.empty()) {
        return error;
    }
    const auto arguments = Arguments(command);
    for (const auto& [name, number] : rule->setToArgument) {
        if (Argument(arguments, number).empty()) {
            return "bad_argument";
        }
        personality_.variables[name] = Argument(arguments, number);
    }
    for (const auto& [name, text] : rule->setToText) {
        personality_.variables[name] = text;
    }
    error = ApplyEffect(rule->effect, arguments, reply);
    if (error.empty()) {
        for (const auto& line : rule->reply) {
            reply->lines.push_back(Fill(line));
        }
    }
    return error;
}

std::string Modem::ApplyEffect(Effect effect, const std::vector<std::string>& arguments,
                               Reply* reply) {
    const std::string first = Argument(arguments, 1);
    const std::string second = Argument(arguments, 2);
    const std::string third = Argument(arguments, 3);
    switch (effect) {
        case Effect::kNone:
        case Effect::kHangUp:  // a port that takes commands has no connection to end
            return "";
        case Effect::kReset:
            personality_.variables["echo"] = initial_["echo"];
            personality_.variables["cmee"] = initial_["cmee"];
            return "";
        case Effect::kDial:
            reply->startsData = true;
            reply->result = "CONNECT";
            return "";
        case Effect::kEnterPin:
            return arguments.size() == 2 ? sim_.EnterPuk(first, second) : sim_.EnterPin(first);
        case Effect::kChangePin:
            return sim_.ChangePin(second, third);
        case Effect::kSetLock:
            return sim_.SetProtection(second == "1", third);
    }
    return "";
}

void Modem::Set(const std::string& name, const std::string& value) {
    if (sim_.Set(name, value)) {
        return;
    }
    const auto variable = personality_.variables.find(name);
    if (variable == personality_.variables.end()) {
        std::string known = "pin, puk, pin_attempts, puk_attempts, lock, sim";
        for (const auto& [other, ignored] : personality_.variables) {
            known += ", " + other;
        }
        throw std::invalid_argument("there is no setting '" + name + "'; there are " + known);
    }
    if (name == "roaming" && value != "yes" && value != "no") {
        throw std::invalid_argument("roaming is yes or no, not '" + value + "'");
    }
    variable->second = value;
    initial_[name] = value;
}

void Modem::OverrideReply(const std::string& pattern, const std::string& text, bool once) {
    RemoveOverride(pattern);
    overrides_.insert(overrides_.begin(), {Normalise(pattern), text, once});
}

void Modem::RemoveOverride(const std::string& pattern) {
    const std::string wanted = Normalise(pattern);
    overrides_.erase(std::remove_if(overrides_.begin(), overrides_.end(),
                                    [&](const auto& entry) { return entry.pattern == wanted; }),
                     overrides_.end());
}

void Modem::PowerCycle() {
    sim_.PowerCycle();
    personality_.variables = initial_;
}

std::string Modem::Value(const std::string& name) const {
    const std::string state = sim_.StateText();
    if (name == "sim_state") {
        return state;
    }
    if (name == "lock") {
        return sim_.IsProtected() ? "1" : "0";
    }
    if (name == "pin_attempts") {
        return std::to_string(sim_.PinAttempts());
    }
    if (name == "puk_attempts") {
        return std::to_string(sim_.PukAttempts());
    }
    if (name == "attempts_now") {  // at the code that the card waits for, if any
        return state == "READY"     ? ""
               : state == "SIM PIN" ? Value("pin_attempts")
                                    : Value("puk_attempts");
    }
    if (name == "registration") {
        const bool registered = sim_.Missing(SimNeed::kUnlocked).empty();
        return !registered ? "0" : Value("roaming") == "yes" ? "5" : "1";
    }
    return personality_.variables.at(name);
}

std::string Modem::Fill(const std::string& line) const {
    std::string filled;
    size_t begin = 0;
    for (size_t open = 0; (open = line.find('{', begin)) != std::string::npos;) {
        const size_t close = line.find('}', open);
        if (close == std::string::npos) {
            break;
        }
        filled += line.substr(begin, open - begin) + Value(line.substr(open + 1, close - open - 1));
        begin = close + 1;
    }
    return filled + line.substr(begin);
}

std::string Modem::Render(const std::string& error) const {
    const std::string level = Value("cmee");
    if (error == kUnknownCommand || level == "0") {
        return "ERROR";
    }
    const ErrorText& text = personality_.errors.at(error);
    return "+CME ERROR: " + (level == "1" ? std::to_string(text.code) : text.text);
}

}  // namespace taviwireless::sim
