// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_RULES_DIAL_LOG_H
#define TAVIWIRELESS_USBMODEM_RULES_DIAL_LOG_H

#include <sstream>
#include <string>

// What the dialler's log tells. The dialler marks its lines, and what stands between them is what
// the modem answered.
namespace taviwireless::usbmodem_lib::dial_log {

inline constexpr char kUsingInterface[] = "Using interface";
inline constexpr char kMark[] = "--> ";

// Where the log names the interface; npos when it does not. An answer of the modem may look like a
// line of the dialler, so only what follows the last command that the modem was sent counts. A
// modem that imitates the dialler in its last answer is believed: it could as well make a
// connection that leads nowhere.
inline size_t FindInterface(const std::string& log) {
    const std::string lines = '\n' + log;
    const size_t lastCommand = lines.rfind("\n--> Sending: ");
    if (lastCommand == std::string::npos) {
        return log.find(kUsingInterface);  // the modem was not asked anything
    }
    const size_t line = lines.find(std::string("\n--> ") + kUsingInterface, lastCommand);
    return line == std::string::npos ? line : lines.find(kUsingInterface, line) - 1;
}

// What the dialler says when it gives up, and what that means; a cause stands before what comes of
// it. Without a meaning the line itself is it.
inline constexpr struct {
    const char* says;
    const char* means;
} kReasons[] = {
    {"cannot run ", nullptr},
    {"Cannot open ", nullptr},
    {"Authentication error", "the provider refused user or password (authentication failed)"},
    {"failed to authenticate", "the provider refused user or password (authentication failed)"},
    {"(PAP) failed", "the provider refused user or password (authentication failed)"},
    {"(CHAP) failed", "the provider refused user or password (authentication failed)"},
    {"Bad init string", "the modem refused its settings; is the APN right?"},
    {"Invalid dial command", "the modem refused to dial; are number and APN right?"},
    {"o dial tone", "there is no dial tone: the modem has no network"},
    {"line is busy", "the line is busy (BUSY)"},
    {"No Answer", "nobody answered (NO ANSWER)"},
    {"No Carrier", "the network did not take the call (NO CARRIER); are APN and number right?"},
    {"carrier signal lost", "the network ended the call at once; is the APN right?"},
    {"Modem not responding", "the modem does not answer the dialler"},
    {"PPP daemon has died", nullptr},
    {"Fatal pppd error", nullptr},
};

// Why the dialler gave up, as a part of a sentence; empty when the log does not tell.
inline std::string ReasonIn(const std::string& log) {
    for (const auto& reason : kReasons) {
        std::istringstream lines(log);
        for (std::string line; std::getline(lines, line);) {
            const bool isMarked = line.rfind(kMark, 0) == 0;
            const size_t begin = isMarked ? sizeof kMark - 1 : 0;
            const bool isDiallers = isMarked || line.rfind("cannot run ", 0) == 0;
            if (isDiallers && line.find(reason.says) != std::string::npos) {
                return reason.means != nullptr ? reason.means : line.substr(begin);
            }
        }
    }
    return "";
}

}  // namespace taviwireless::usbmodem_lib::dial_log

#endif
