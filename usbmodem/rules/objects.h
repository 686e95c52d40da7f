// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_RULES_OBJECTS_H
#define TAVIWIRELESS_USBMODEM_RULES_OBJECTS_H

// How the state of the modems is called on the session bus. daemon/modem_objects.xml tells what the
// objects hold.
namespace taviwireless::usbmodem_lib::objects {

inline constexpr char kService[] = "com.merilond.usbmodem.Objects";
inline constexpr char kManager[] = "/com/merilond/usbmodem";  // modems lie below, by device id
inline constexpr char kModem[] = "com.merilond.usbmodem.Modem";

}  // namespace taviwireless::usbmodem_lib::objects

#endif
