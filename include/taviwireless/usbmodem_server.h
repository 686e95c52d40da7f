// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_SERVER_H
#define TAVIWIRELESS_USBMODEM_SERVER_H

#include <taviwireless/dbus_server.h>
#include <taviwireless/usbmodem_list.h>

namespace taviwireless::dbus {

// The GObject type "USBModemObject": what the service exports. It holds the modems, and no method
// of it looks for new ones.
struct USBModemObject {
    GObject parent;
    usbmodem_lib::USBModemList list;
};

// Registers the type at the first call, from any thread.
TAVIWIRELESS_API GType usbmodem_object_get_type();

// The modem service "com.merilond.usbmodem" on the session bus: object "/", interface
// "com.merilond.usbmodem". Every argument is a string but protection, a boolean.
//
//   Connect(devid)                 dials; done when the dialler was started
//   Disconnect(devid)              hangs up
//   GetUSBModemList()              device ids of the modems that are ready for use, a line each
//   GetUSBModem(devid)             modem document; asks the modem, about two seconds
//   UnlockSIM(devid, pin)          enters the PIN
//   UnlockPIN(devid, puk, pin)     sets a new PIN with the PUK
//   SetPIN(devid, oldpin, newpin, protection)
//                                  switches the protection, then changes the PIN unless newpin is
//                                  empty
//   GetProfile(devid)              profile document
//   SetProfile(devid, profile)     sets what the lines KEY=VALUE say, for the keys apn, number,
//                                  user, pass, IMSI, location, isp and default_gw; a connected
//                                  modem is disconnected before and connected again after it,
//                                  unless one of the values is refused: then nothing is done.
//                                  A key counts wherever it stands in a line, and the first of
//                                  this order that is found.
//   GetUSBModemIfList()            network interfaces of the ready modems, a line each, in the
//                                  order of GetUSBModemList; an empty line for a modem without
//
// Documents look like JSON, one value a line, and are JSON as long as no text in them holds a quote
// or a backslash: values stand in them as the modem sent them. "roaming" is a bare word.
//
// Errors are "org.freedesktop.DBus.GLib.UnmappedError.GTypePrivateDependantsArray.Code" and the
// code as an unsigned number: -1 for a modem that is unknown, not ready, or failed to dial or hang
// up; 1 for a missing argument; n where an operation on the modem returned -n. The PIN methods do
// nothing, without an error, to a modem that is busy with a connection.
//
// dbus/usbmodem.xml in the sources documents each method, argument and error.
class TAVIWIRELESS_API USBModemServer : public DBusServer {
  public:
    // Connects to the session bus and makes the object, with an empty list.
    USBModemServer();
    // Ends the records of the list; connections that run go on.
    ~USBModemServer() override;

    // Asks for the name and exports the object; false when the bus cannot be asked.
    bool Initialize();

    // The modems that the service serves; borrowed. Whoever runs the service fills the list and
    // keeps it up to date, on the thread that runs the loop.
    usbmodem_lib::USBModemList* GetList();

  private:
    USBModemObject* object_ = nullptr;
};

}  // namespace taviwireless::dbus

#endif
