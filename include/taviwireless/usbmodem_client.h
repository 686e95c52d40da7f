#ifndef TAVIWIRELESS_USBMODEM_CLIENT_H
#define TAVIWIRELESS_USBMODEM_CLIENT_H

#include <taviwireless/dbus_client.h>
#include <taviwireless/export.h>

#include <string>

namespace taviwireless::dbus {

// Calls the modem service; usbmodem_server.h tells what its methods do. Waits as long as libdbus
// does by default (25 s), except that SetProfile, Connect and Disconnect do not wait at all: their
// 0 says that the call was sent. Other results are 0, or below 0 for a failure; of UnlockPIN,
// UnlockSIM and SetPIN the failure of the modem. The service's error -1 (no such modem, not ready)
// counts as success of these three.
class TAVIWIRELESS_API USBModemClient : public DBusClient {
  public:
    USBModemClient();
    ~USBModemClient() override;

    int GetUSBModemIfList(std::string& out);
    int GetUSBModemList(std::string& out);
    int GetUSBModem(const std::string& devid, std::string& out);
    int GetProfile(const std::string& devid, std::string& out);
    int SetProfile(const std::string& devid, const std::string& profile);
    int UnlockPIN(const std::string& devid, const std::string& puk, const std::string& pin);
    int UnlockSIM(const std::string& devid, const std::string& pin);
    int SetPIN(const std::string& devid, const std::string& oldpin, const std::string& newpin,
               bool protection);
    int Connect(const std::string& devid);
    int Disconnect(const std::string& devid);

    // Whether the service is on the bus. Does not start it.
    bool IsServerReady() const;
};

}  // namespace taviwireless::dbus

#endif
