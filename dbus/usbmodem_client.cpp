// SPDX-License-Identifier: MIT
#include <taviwireless/usbmodem_client.h>

#include <algorithm>
#include <initializer_list>
#include <vector>

#include "dbus/usbmodem_service.h"

namespace taviwireless::dbus {

namespace {

constexpr int kDefaultTimeout = -1;
constexpr int kNoTimeout =
    0x7FFFFFFF;  // milliseconds; without a reply to wait for it means nothing

using Texts = std::initializer_list<std::reference_wrapper<const std::string>>;

bool Build(DBusClient& client, const char* method, Texts arguments) {
    return client.NewMessage(method) >= 0 &&
           std::all_of(arguments.begin(), arguments.end(), [&client](const std::string& text) {
               return client.Append(text.c_str()) >= 0;
           });
}

// Calls for the text that the method returns.
int Ask(DBusClient& client, const char* method, Texts arguments, std::string& out) {
    const bool hasReply =
        Build(client, method, arguments) && client.SendMessage(true, kDefaultTimeout) >= 0;
    return hasReply && client.GetReply(out) >= 0 ? 0 : -1;
}

// Waits until it is done. A positive result is the service's error -1; see the public header.
int WaitFor(DBusClient& client) {
    const int result = client.SendMessage(true, kDefaultTimeout);
    return result < 0 ? result : 0;
}

int Tell(DBusClient& client, const char* method, Texts arguments, int timeout) {
    return Build(client, method, arguments) && client.SendMessage(false, timeout) >= 0 ? 0 : -1;
}

}  // namespace

USBModemClient::USBModemClient()
    : DBusClient(kUSBModemService, kUSBModemPath, kUSBModemService, DBUS_BUS_SESSION) {}

USBModemClient::~USBModemClient() = default;

int USBModemClient::GetUSBModemIfList(std::string& out) {
    return Ask(*this, "GetUSBModemIfList", {}, out);
}

int USBModemClient::GetUSBModemList(std::string& out) {
    return Ask(*this, "GetUSBModemList", {}, out);
}

int USBModemClient::GetUSBModem(const std::string& devid, std::string& out) {
    return Ask(*this, "GetUSBModem", {devid}, out);
}

int USBModemClient::GetProfile(const std::string& devid, std::string& out) {
    return Ask(*this, "GetProfile", {devid}, out);
}

int USBModemClient::SetProfile(const std::string& devid, const std::string& profile) {
    return Tell(*this, "SetProfile", {devid, profile}, kDefaultTimeout);
}

int USBModemClient::UnlockPIN(const std::string& devid, const std::string& puk,
                              const std::string& pin) {
    return Build(*this, "UnlockPIN", {devid, puk, pin}) ? WaitFor(*this) : -1;
}

int USBModemClient::UnlockSIM(const std::string& devid, const std::string& pin) {
    return Build(*this, "UnlockSIM", {devid, pin}) ? WaitFor(*this) : -1;
}

int USBModemClient::SetPIN(const std::string& devid, const std::string& oldpin,
                           const std::string& newpin, bool protection) {
    return Build(*this, "SetPIN", {devid, oldpin, newpin}) && Append(protection) >= 0
               ? WaitFor(*this)
               : -1;
}

int USBModemClient::Connect(const std::string& devid) {
    return Tell(*this, "Connect", {devid}, kNoTimeout);
}

int USBModemClient::Disconnect(const std::string& devid) {
    return Tell(*this, "Disconnect", {devid}, kDefaultTimeout);
}

bool USBModemClient::IsServerReady() const {
    DBusClient bus(DBUS_SERVICE_DBUS, DBUS_PATH_DBUS, DBUS_INTERFACE_DBUS, DBUS_BUS_SESSION);
    std::vector<std::string> names;
    return bus.NewMessage("ListNames") == 0 && bus.SendMessage(true, kDefaultTimeout) == 0 &&
           bus.GetReply(names) == 0 &&
           std::find(names.begin(), names.end(), kUSBModemService) != names.end();
}

}  // namespace taviwireless::dbus
