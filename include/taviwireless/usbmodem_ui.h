// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_UI_H
#define TAVIWIRELESS_USBMODEM_UI_H

#include <taviwireless/export.h>

#include <string>
#include <vector>

// What a front end calls: one call of the modem service each, without any state in between.
// usbmodem_server.h tells what the calls do and what the documents hold.
//
// devid is a device id of GetUSBModemList, such as "usbmodem0". Texts are UTF-8.
//
// Results: 1 when it was done, 0 when the service is not on the bus (no log line; it is not
// started), below 0 when the call failed, with a log line. Text results are empty in both cases of
// failure. A call waits for the service for 25 s at most, the default of libdbus.
namespace taviwireless::usbmodem_ui {

// Append to list, which is not cleared first: the network interfaces or the device ids of the
// modems that are ready for use, in the order in which they were found. A modem without connection
// has the empty text as interface.
TAVIWIRELESS_API int GetUSBModemIfList(std::vector<std::string>& list);
TAVIWIRELESS_API int GetUSBModemList(std::vector<std::string>& list);

// The documents of one modem: its state, which the service asks it for (about two seconds), and its
// profile.
TAVIWIRELESS_API std::string GetUSBModem(const std::string& devid);
TAVIWIRELESS_API std::string GetProfile(const std::string& devid);

// Sends the settings and returns 1 at once: whether they were taken shows in GetProfile.
// profile: lines KEY=VALUE, for the keys that usbmodem_server.h lists.
TAVIWIRELESS_API int SetProfile(const std::string& devid, const std::string& profile);

// These wait for the modem: 1 when it was done; -2 when it refused the PIN or PUK, -1 when it could
// not be asked. Compatible with the front ends, 1 also for a modem that the service does not know,
// that is not ready, or that is busy with a connection; GetUSBModem then shows the state as it is.
//
// Switches the protection by oldpin; then changes the PIN to newpin unless that is empty.
TAVIWIRELESS_API int SetPIN(const std::string& devid, const std::string& oldpin,
                            const std::string& newpin, bool protection);
// Sets a new PIN with the PUK, for a SIM that is locked by too many wrong PINs.
TAVIWIRELESS_API int UnlockPIN(const std::string& devid, const std::string& puk,
                               const std::string& pin);
// Enters the PIN.
TAVIWIRELESS_API int UnlockSIM(const std::string& devid, const std::string& pin);

// Dials, or hangs up. Both return 1 as soon as the call is sent: what came of it shows in the
// "net_status" of GetUSBModem.
TAVIWIRELESS_API int Connect(const std::string& devid);
TAVIWIRELESS_API int Disconnect(const std::string& devid);

}  // namespace taviwireless::usbmodem_ui

#endif
