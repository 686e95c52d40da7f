// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DBUS_USBMODEM_DOCUMENTS_H
#define TAVIWIRELESS_DBUS_USBMODEM_DOCUMENTS_H

#include <taviwireless/usbmodem.h>

#include <chrono>
#include <string>

namespace taviwireless::dbus {

// A modem that answers begins to do so long before this time is over; one that does not answer
// costs more.
inline constexpr std::chrono::milliseconds kPatience{1000};

// What GetProfile answers: the profile of the modem's SIM.
std::string ProfileDocument(usbmodem_lib::USBModem& modem);

// What GetUSBModem answers: the modem, its SIM, its connection and the profile. Looks at the link
// first.
std::string ModemDocument(usbmodem_lib::USBModem& modem);

}  // namespace taviwireless::dbus

#endif
