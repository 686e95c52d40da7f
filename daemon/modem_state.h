// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_MODEM_STATE_H
#define TAVIWIRELESS_DAEMON_MODEM_STATE_H

#include <taviwireless/usbmodem.h>

#include <cstdint>
#include <ctime>
#include <string>

#include "daemon/property.h"

namespace taviwireless::daemon {

// What the object of a modem shows.
struct ModemState {
    std::string id;
    bool answers = false;
    usbmodem_lib::KnownModem known;
    time_t lastLook = 0;  // 0: never
    time_t dialledAt = 0;
    std::uint64_t bytesSent = 0;
    std::uint64_t bytesReceived = 0;
};

// All that can be told of a modem without asking it.
ModemState StateOf(const usbmodem_lib::USBModem& modem, time_t lastLook);

// The properties of modem_objects.xml, in its order.
Properties PropertiesOf(const ModemState& state);

}  // namespace taviwireless::daemon

#endif
