// The functions that front ends call.
#include <taviwireless/usbmodem_client.h>
#include <taviwireless/usbmodem_ui.h>

#include <sstream>

#include "common/log.h"

namespace taviwireless::usbmodem_ui {

namespace {

using dbus::USBModemClient;

constexpr int kNotReady = 0;
constexpr int kDone = 1;

// Appends the lines of a list reply; returns false when the call failed.
bool AppendLines(USBModemClient& client, int (USBModemClient::*call)(std::string& out),
                 std::vector<std::string>& list) {
    std::string reply;
    if ((client.*call)(reply) < 0) {
        return false;
    }
    std::istringstream lines(reply);
    for (std::string line; std::getline(lines, line);) {
        list.push_back(line);
    }
    return true;
}

}  // namespace

int GetUSBModemIfList(std::vector<std::string>& list) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    if (!AppendLines(client, &USBModemClient::GetUSBModemIfList, list)) {
        TAVI_LOG_ERROR("Failed to get usbmodem interface list");
        return -1;
    }
    return kDone;
}

int GetUSBModemList(std::vector<std::string>& list) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    if (!AppendLines(client, &USBModemClient::GetUSBModemList, list)) {
        TAVI_LOG_ERROR("Failed to get usbmodem list");
        return -1;
    }
    return kDone;
}

std::string GetUSBModem(const std::string& devid) {
    USBModemClient client;
    std::string document;
    if (client.IsServerReady() && client.GetUSBModem(devid, document) < 0) {
        TAVI_LOG_ERROR("Failed to get %s information", devid.c_str());
    }
    return document;
}

std::string GetProfile(const std::string& devid) {
    USBModemClient client;
    std::string document;
    if (client.IsServerReady() && client.GetProfile(devid, document) < 0) {
        TAVI_LOG_ERROR("Failed to get %s profile", devid.c_str());
    }
    return document;
}

int SetProfile(const std::string& devid, const std::string& profile) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    if (client.SetProfile(devid, profile) < 0) {
        TAVI_LOG_ERROR("Failed to set profile of device: %s", devid.c_str());
        return -1;
    }
    return kDone;
}

int SetPIN(const std::string& devid, const std::string& oldpin, const std::string& newpin,
           bool protection) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    const int result = client.SetPIN(devid, oldpin, newpin, protection);
    if (result < 0) {
        TAVI_LOG_ERROR("Failed to set SIM's PIN of device: %s", devid.c_str());
        return result;
    }
    return kDone;
}

int UnlockPIN(const std::string& devid, const std::string& puk, const std::string& pin) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    const int result = client.UnlockPIN(devid, puk, pin);
    if (result < 0) {
        TAVI_LOG_ERROR("Failed to unlock PIN of device: %s", devid.c_str());
        return result;
    }
    return kDone;
}

int UnlockSIM(const std::string& devid, const std::string& pin) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    const int result = client.UnlockSIM(devid, pin);
    if (result < 0) {
        TAVI_LOG_ERROR("Failed to unlock SIM of device: %s", devid.c_str());
        return result;
    }
    return kDone;
}

int Connect(const std::string& devid) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    return client.Connect(devid) < 0 ? -1 : kDone;
}

int Disconnect(const std::string& devid) {
    USBModemClient client;
    if (!client.IsServerReady()) {
        return kNotReady;
    }
    return client.Disconnect(devid) < 0 ? -1 : kDone;
}

}  // namespace taviwireless::usbmodem_ui
