// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_USBMODEM_OPENED_MODEM_H
#define TAVIWIRELESS_TESTS_USBMODEM_OPENED_MODEM_H

#include <gmock/gmock.h>
#include <taviwireless/usbmodem.h>

#include <stdexcept>
#include <string>
#include <vector>

#include "tests/support/log_capture.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {

constexpr char kInfo1[] = "/tmp/usbmodem.info1";
constexpr char kQueryPort[] = "/dev/ttyUSB1";

// Lines as a modem sends them.
inline std::string Framed(const std::vector<std::string>& lines) {
    std::string text;
    for (const std::string& line : lines) {
        text += "\r\n" + line + "\r\n";
    }
    return text;
}

// Modem 1 of the simulator with a dial port and a query port, and a record of it whose channel is
// open on the query port.
struct OpenedModem {
    // description is modemsim's: a personality and settings.
    explicit OpenedModem(const std::string& description = "12d1")
        : simulator({"--modem", description + ",id=1,ports=dial/at"}), record(1, kInfo1) {
        record.SetATInterface();
        if (record.OpenFileDevice(kQueryPort) != 0) {
            throw std::runtime_error("the simulated modem cannot be opened");
        }
        log.Clear();
    }

    std::vector<std::string> Received() { return simulator.Received("1"); }

    ModemSimulator simulator;
    usbmodem_lib::USBModem record;
    LogCapture log;
};

}  // namespace taviwireless::test

#endif
