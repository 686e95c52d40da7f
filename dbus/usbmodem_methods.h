// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DBUS_USBMODEM_METHODS_H
#define TAVIWIRELESS_DBUS_USBMODEM_METHODS_H

#include <taviwireless/usbmodem_server.h>

// The methods of the modem service, as the object description in usbmodem.xml names them; the
// public header tells what they do. Each returns TRUE, or FALSE with the error set and logged.
// Texts that are returned belong to the caller (g_free).
namespace taviwireless::dbus {

gboolean usbmodem_connect(USBModemObject* object, char* devid, GError** error);
gboolean usbmodem_disconnect(USBModemObject* object, char* devid, GError** error);
gboolean usbmodem_get_usbmodem_list(USBModemObject* object, char** list, GError** error);
gboolean usbmodem_get_usbmodem_if_list(USBModemObject* object, char** list, GError** error);
gboolean usbmodem_get_usbmodem(USBModemObject* object, char* devid, char** document,
                               GError** error);
gboolean usbmodem_get_profile(USBModemObject* object, char* devid, char** document, GError** error);
gboolean usbmodem_set_profile(USBModemObject* object, char* devid, char* profile, GError** error);
gboolean usbmodem_unlock_sim(USBModemObject* object, char* devid, char* pin, GError** error);
gboolean usbmodem_unlock_pin(USBModemObject* object, char* devid, char* puk, char* pin,
                             GError** error);
gboolean usbmodem_set_pin(USBModemObject* object, char* devid, char* oldpin, char* newpin,
                          gboolean protection, GError** error);

}  // namespace taviwireless::dbus

#endif
