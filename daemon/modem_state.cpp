// SPDX-License-Identifier: MIT
#include "daemon/modem_state.h"

#include <sys/stat.h>

#include <fstream>

#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

namespace {

using usbmodem_lib::KnownModem;

std::uint64_t CountOf(const std::string& interface, const char* counter) {
    std::uint64_t count = 0;
    std::ifstream("/sys/class/net/" + interface + "/statistics/" + counter) >> count;
    return count;
}

std::vector<std::string> PortsOf(const KnownModem& known) {
    std::vector<std::string> ports;
    for (const std::string* port : {&known.connectNode, &known.queryNode}) {
        if (!port->empty()) {
            ports.push_back(*port);
        }
    }
    return ports;
}

}  // namespace

ModemState StateOf(const usbmodem_lib::USBModem& modem, time_t lastLook) {
    ModemState state;
    state.id = modem.GetDevId();
    state.answers = modem.IsInited();
    state.known = modem.Known();
    state.lastLook = lastLook;
    if (!state.known.interface.empty()) {
        struct stat pidFile {};
        const std::string path = usbmodem_lib::kPidFilePrefix + std::to_string(modem.GetIfid());
        stat(path.c_str(), &pidFile);
        state.dialledAt = pidFile.st_mtime;
        state.bytesSent = CountOf(state.known.interface, "tx_bytes");
        state.bytesReceived = CountOf(state.known.interface, "rx_bytes");
    }
    return state;
}

Properties PropertiesOf(const ModemState& state) {
    constexpr bool kUntold = false;
    const KnownModem& known = state.known;
    return {
        {"Answers", state.answers},
        {"Vendor", ShownText(known.vendor)},
        {"Product", ShownText(known.product)},
        {"Operator", ShownText(known.carrier)},
        {"Signal", static_cast<std::uint32_t>(known.signal)},
        {"SimState", known.simStatus},
        {"PinLock", known.isPINProtected},
        {"PinAttempts", known.pinRemains},
        {"PukAttempts", known.pukRemains},
        {"Imsi", ShownText(known.imsi)},
        {"Roaming", known.isRoaming},
        {"NetState", known.netStatus},
        {"Interface", ShownText(known.interface)},
        {"Address", ShownText(known.address)},
        {"DialledAt", static_cast<std::uint64_t>(state.dialledAt)},
        {"BytesSent", state.bytesSent, kUntold},
        {"BytesReceived", state.bytesReceived, kUntold},
        {"Ports", PortsOf(known)},
        {"LogFile", known.imsi.empty() ? "" : ShownText(usbmodem_lib::DialLogPath(known.imsi))},
        {"LastLook", static_cast<std::uint64_t>(state.lastLook), kUntold},
    };
}

}  // namespace taviwireless::daemon
