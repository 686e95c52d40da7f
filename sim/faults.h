// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_FAULTS_H
#define TAVIWIRELESS_SIM_FAULTS_H

#include <chrono>
#include <optional>
#include <string>

namespace taviwireless::sim {

using Milliseconds = std::chrono::milliseconds;

// How one port misbehaves. Faults add up until they are switched off.
struct Faults {
    bool silent = false;
    bool noEcho = false;
    bool garbage = false;
    bool babble = false;
    Milliseconds slow{0};
    size_t pieceSize = 0;  // bytes; 0: all at once
    Milliseconds pieceGap{20};
    size_t longReply = 0;               // bytes that a reply has at least
    std::string unsolicited;            // empty: none
    std::string failing;                // pattern of the commands that fail; empty: none
    std::optional<size_t> vanishAfter;  // bytes of the next reply after which the port is gone

    // Adds the fault that `text` describes, KIND or KIND=ARGUMENT; "off" takes all away. Throws
    // std::invalid_argument with a sentence when it describes none.
    void Add(const std::string& text);
};

// The faults and what they mean, one a line.
std::string FaultHelp();

}  // namespace taviwireless::sim

#endif
