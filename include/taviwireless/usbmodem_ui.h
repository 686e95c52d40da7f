#ifndef TAVIWIRELESS_USBMODEM_UI_H
#define TAVIWIRELESS_USBMODEM_UI_H

#include <taviwireless/export.h>

#include <string>
#include <vector>

// What a front end calls: one call of the modem service each, without any state in between.
// usbmodem_server.h tells what the calls do and what the documents hold.
//
// Results: 1 when it was done, 0 when the service is not on the bus (no log line), below 0 when the
// call failed, with a log line. Text results are empty in both cases of failure.
//
// SetProfile, Connect and Disconnect return 1 as soon as the call is sent: whether the modem did it
// shows in GetProfile and GetUSBModem. SetPIN, UnlockPIN and UnlockSIM return 1 also for a modem
// that the service does not know or that is not ready, and -2 when the modem refused the PIN or
// PUK, -1 when it could not be asked.
namespace taviwireless::usbmodem_ui {

// Append to list, which is not cleared first.
TAVIWIRELESS_API int GetUSBModemIfList(std::vector<std::string>& list);
TAVIWIRELESS_API int GetUSBModemList(std::vector<std::string>& list);

TAVIWIRELESS_API std::string GetUSBModem(const std::string& devid);
TAVIWIRELESS_API std::string GetProfile(const std::string& devid);

// profile: lines KEY=VALUE.
TAVIWIRELESS_API int SetProfile(const std::string& devid, const std::string& profile);

TAVIWIRELESS_API int SetPIN(const std::string& devid, const std::string& oldpin,
                            const std::string& newpin, bool protection);
TAVIWIRELESS_API int UnlockPIN(const std::string& devid, const std::string& puk,
                               const std::string& pin);
TAVIWIRELESS_API int UnlockSIM(const std::string& devid, const std::string& pin);

TAVIWIRELESS_API int Connect(const std::string& devid);
TAVIWIRELESS_API int Disconnect(const std::string& devid);

}  // namespace taviwireless::usbmodem_ui

#endif
