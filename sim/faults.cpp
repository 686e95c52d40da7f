// SPDX-License-Identifier: MIT
#include "sim/faults.h"

#include <cstdio>
#include <stdexcept>

#include "sim/at_text.h"
#include "sim/user_text.h"

namespace taviwireless::sim {
namespace {

struct FaultKind {
    const char* name;
    const char* argument;  // as shown in the help; empty: takes none, in brackets: may be missing
    const char* meaning;
    void (*add)(Faults& faults, const std::string& argument);
};

void AddPieces(Faults& faults, const std::string& argument) {
    const size_t slash = argument.find('/');
    faults.pieceSize = ParseNumber(argument.substr(0, slash), "the argument");
    if (slash != std::string::npos) {
        faults.pieceGap = Milliseconds(ParseNumber(argument.substr(slash + 1), "the argument"));
    }
}

const FaultKind kKinds[] = {
    {"silent", "", "takes commands, answers nothing",
     [](Faults& faults, const std::string&) { faults.silent = true; }},
    {"slow", "=MS", "waits before every reply",
     [](Faults& faults, const std::string& ms) {
         faults.slow = Milliseconds(ParseNumber(ms, "the argument"));
     }},
    {"pieces", "=BYTES[/MS]", "sends replies in pieces with a gap (20 ms) between them", AddPieces},
    {"unsolicited", "=LINE", "sends LINE before every reply and again before its result",
     [](Faults& faults, const std::string& line) { faults.unsolicited = line; }},
    {"error", "[=COMMAND]", "answers ERROR, to every command or to this one (a last * matches on)",
     [](Faults& faults, const std::string& command) {
         faults.failing = command.empty() ? "*" : Normalise(command);
     }},
    {"long", "=BYTES", "fills replies up to this length with lines before the result",
     [](Faults& faults, const std::string& size) {
         faults.longReply = ParseNumber(size, "the argument");
     }},
    {"babble", "", "sends lines without end",
     [](Faults& faults, const std::string&) { faults.babble = true; }},
    {"vanish", "[=BYTES]", "is unplugged by the next command, BYTES (0) into its reply",
     [](Faults& faults, const std::string& size) {
         faults.vanishAfter = size.empty() ? 0 : ParseNumber(size, "the argument");
     }},
    {"noecho", "", "does not echo, whatever ATE1 says",
     [](Faults& faults, const std::string&) { faults.noEcho = true; }},
    {"garbage", "", "sends bytes that are no text before every reply",
     [](Faults& faults, const std::string&) { faults.garbage = true; }},
};

}  // namespace

void Faults::Add(const std::string& text) {
    if (text == "off") {
        *this = Faults();
        return;
    }
    const size_t equals = text.find('=');
    const std::string name = text.substr(0, equals);
    const std::string argument = equals == std::string::npos ? "" : text.substr(equals + 1);
    std::string known;
    for (const FaultKind& kind : kKinds) {
        if (name != kind.name) {
            known += std::string(kind.name) + ", ";
            continue;
        }
        const bool takesNone = *kind.argument == '\0';
        const bool needsOne = !takesNone && *kind.argument != '[';
        if ((takesNone && !argument.empty()) || (needsOne && argument.empty())) {
            throw std::invalid_argument("the fault is written " + name + kind.argument);
        }
        kind.add(*this, argument);
        return;
    }
    throw std::invalid_argument("there is no fault '" + name + "'; there are " + known + "off");
}

std::string FaultHelp() {
    std::string help;
    for (const FaultKind& kind : kKinds) {
        const std::string written = std::string(kind.name) + kind.argument;
        char line[160];
        std::snprintf(line, sizeof line, "  %-20s %s\n", written.c_str(), kind.meaning);
        help += line;
    }
    return help + "  off                  behaves again\n";
}

}  // namespace taviwireless::sim
