// SPDX-License-Identifier: MIT
// The functions that front ends call.
#include <taviwireless/usbmodem_client.h>
#include <taviwireless/usbmodem_ui.h>

#include "base/split.h"
#include "common/log.h"

namespace taviwireless::usbmodem_ui {

namespace {

using dbus::USBModemClient;

constexpr int kNotReady = 0;
constexpr int kDone = 1;

// Calls the service if it is on the bus. A failure is a line in the log, unless there is no text.
template <typename Call>
int Ask(Call call, const std::string& failure) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    const int result = call(client);
    if (result < 0 && !failure.empty()) {
        TAVI_LOG_ERROR("%s", failure.c_str());
    }
    return result < 0 ? result : kDone;
}

// Appends the lines of a list.
int AppendLines(int (USBModemClient::*get)(std::string& out), std::vector<std::string>& list,
                const char* failure) {
    std::string text;
    const int result = Ask([&](USBModemClient& client) { return (client.*get)(text); }, failure);
    const std::vector<std::string> lines = Lines(text);
    list.insert(list.end(), lines.begin(), lines.end());
    return result;
}

}  // namespace

int GetUSBModemIfList(std::vector<std::string>& list) {
    return AppendLines(&USBModemClient::GetUSBModemIfList, list,
                       "Failed to get usbmodem interface list");
}

int GetUSBModemList(std::vector<std::string>& list) {
    return AppendLines(&USBModemClient::GetUSBModemList, list, "Failed to get usbmodem list");
}

std::string GetUSBModem(const std::string& devid) {
    std::string document;
    Ask([&](USBModemClient& client) { return client.GetUSBModem(devid, document); },
        "Failed to get " + devid + " information");
    return document;
}

std::string GetProfile(const std::string& devid) {
    std::string document;
    Ask([&](USBModemClient& client) { return client.GetProfile(devid, document); },
        "Failed to get " + devid + " profile");
    return document;
}

int SetProfile(const std::string& devid, const std::string& profile) {
    return Ask([&](USBModemClient& client) { return client.SetProfile(devid, profile); },
               "Failed to set profile of device: " + devid);
}

int SetPIN(const std::string& devid, const std::string& oldpin, const std::string& newpin,
           bool protection) {
    return Ask(
        [&](USBModemClient& client) { return client.SetPIN(devid, oldpin, newpin, protection); },
        "Failed to set SIM's PIN of device: " + devid);
}

int UnlockPIN(const std::string& devid, const std::string& puk, const std::string& pin) {
    return Ask([&](USBModemClient& client) { return client.UnlockPIN(devid, puk, pin); },
               "Failed to unlock PIN of device: " + devid);
}

int UnlockSIM(const std::string& devid, const std::string& pin) {
    return Ask([&](USBModemClient& client) { return client.UnlockSIM(devid, pin); },
               "Failed to unlock SIM of device: " + devid);
}

int Connect(const std::string& devid) {
    return Ask([&](USBModemClient& client) { return client.Connect(devid); }, "");
}

int Disconnect(const std::string& devid) {
    return Ask([&](USBModemClient& client) { return client.Disconnect(devid); }, "");
}

}  // namespace taviwireless::usbmodem_ui
