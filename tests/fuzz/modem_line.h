// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_FUZZ_MODEM_LINE_H
#define TAVIWIRELESS_TESTS_FUZZ_MODEM_LINE_H

#include <taviwireless/usbmodem_server.h>

#include <functional>
#include <string>
#include <vector>

namespace taviwireless::fuzz {

// Modem 1 without a modem: the serial line of its record ends in this process, and waiting for it
// takes no time. Only what the line takes counts on the clock, which is the same in every run.
struct ModemLine {
    // What the modem sends when it got a command, which comes without its carriage return. A kPause
    // in it is silence that is long enough to end a reply, or the draining before a command.
    using Answer = std::function<std::string(const std::string& command)>;
    static constexpr char kPause = '\x01';

    // One for each command set.
    static constexpr const char* kVendors[] = {"", "12d1", "2001"};

    // The record is as InitInfo leaves it: of the SIM it is known that it is ready.
    ModemLine(unsigned vendor, Answer answerOfModem);
    ~ModemLine();
    ModemLine(const ModemLine&) = delete;
    ModemLine& operator=(const ModemLine&) = delete;

    Answer answer;
    std::vector<std::string> written;  // to the line, a text for each write
    std::string coming;                // from the modem, not yet read

    dbus::USBModemObject* const service;  // has the modem in its list
    usbmodem_lib::USBModem& record;       // which is this one
};

}  // namespace taviwireless::fuzz

#endif
