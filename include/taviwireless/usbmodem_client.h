// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_CLIENT_H
#define TAVIWIRELESS_USBMODEM_CLIENT_H

#include <taviwireless/dbus_client.h>
#include <taviwireless/export.h>

#include <string>

namespace taviwireless::dbus {

// Calls the modem service; usbmodem_server.h tells what its methods do. One member function is one
// call of the method of its name; a failure is one line in the system log. Text must be UTF-8.
//
// Calls that return text or an outcome wait as long as libdbus does by default (25 s). A service
// that is not running is started by the call where the bus knows how; IsServerReady tells before.
class TAVIWIRELESS_API USBModemClient : public DBusClient {
  public:
    // Connects to the session bus. Without one every call fails.
    USBModemClient();
    ~USBModemClient() override;

    // Each sets out to the text that the method returns. 0; -1 on failure, with out as it was.
    int GetUSBModemIfList(std::string& out);
    int GetUSBModemList(std::string& out);
    int GetUSBModem(const std::string& devid, std::string& out);
    int GetProfile(const std::string& devid, std::string& out);
    // Sends the lines KEY=VALUE and does not wait: 0 says that the call was sent, -1 that it was
    // not.
    int SetProfile(const std::string& devid, const std::string& profile);
    // These wait for the outcome. 0 when it was done, and also when the modem is busy with a
    // connection and nothing was sent; -2 when the modem refused the code; -1 when it could not be
    // asked or the call failed. Compatible with the front ends: the service's error -1 (no such
    // modem, or not ready) counts as success here.
    int UnlockPIN(const std::string& devid, const std::string& puk, const std::string& pin);
    int UnlockSIM(const std::string& devid, const std::string& pin);
    int SetPIN(const std::string& devid, const std::string& oldpin, const std::string& newpin,
               bool protection);
    // Send the call and do not wait: 0 says that it was sent, -1 that it was not.
    int Connect(const std::string& devid);
    int Disconnect(const std::string& devid);

    // Whether the service is on the bus, by the bus's list of names. Does not start it. False, with
    // a line in the log, also when the bus cannot be asked.
    bool IsServerReady() const;
};

}  // namespace taviwireless::dbus

#endif
