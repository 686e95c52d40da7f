// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DBUS_USBMODEM_SERVICE_H
#define TAVIWIRELESS_DBUS_USBMODEM_SERVICE_H

namespace taviwireless::dbus {

// How the modem service is called on the session bus. usbmodem.xml has the interface's name too.
constexpr char kUSBModemService[] = "com.merilond.usbmodem";
constexpr char kUSBModemPath[] = "/";

}  // namespace taviwireless::dbus

#endif
