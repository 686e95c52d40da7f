// SPDX-License-Identifier: MIT
// The state of the link, derived from the dialler's process, its log and the interface's address.
#include <fcntl.h>
#include <tavicore/process.h>
#include <tavisdk/network.h>
#include <taviwireless/usbmodem.h>

#include <cerrno>
#include <cstring>

#include "base/unique_fd.h"
#include "common/log.h"
#include "usbmodem/rules/status.h"

namespace taviwireless::usbmodem_lib {

int USBModem::GetLinkStats() {
    const std::string pidFile = PidFilePath();
    // The SDK's answer cannot tell a process that is dead from one that could not be looked at.
    UniqueFd file(open(pidFile.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    if (!file && errno != ENOENT && errno != ENOTDIR) {
        TAVI_LOG_ERROR("cannot open %s: %s", pidFile.c_str(), strerror(errno));
        return -1;
    }
    const bool wasDialled = static_cast<bool>(file);
    file.Close();
    if (!wasDialled || VEXACProcAliveByPidFile(pidFile.c_str()) != 1) {
        netStatus_ =
            connectFailedAttempts_ < 1 ? NetStatus::kDisconnected : NetStatus::kConnectionLost;
        return 0;
    }
    if (UpdateIP() != 0) {
        TAVI_LOG_ERROR("failed to update ip");
        return 0;
    }
    if (!netIFName_.empty() && !netLocalIP_.empty()) {
        netStatus_ = NetStatus::kConnected;
    } else if (netStatus_ == NetStatus::kConnected || netStatus_ == NetStatus::kReconnecting) {
        netStatus_ = NetStatus::kReconnecting;
    } else {
        netStatus_ = NetStatus::kConnecting;
    }
    return 0;
}

int USBModem::UpdateIP() {
    if (netIFName_.empty()) {
        return 0;
    }
    netLocalIP_.clear();
    TAVINetIFInfo info;
    switch (TAVINetIFGetInfo(netIFName_.c_str(), &info)) {
        case 0:
            return 0;
        case 1:
            netLocalIP_ = info.address;
            return 0;
        default:
            TAVI_LOG_ERROR("error on updating ip for if %s", netIFName_.c_str());
            return -1;
    }
}

int USBModem::UpdateNetStatus() {
    if (GetLinkStats() != 0) {
        TAVI_LOG_ERROR("failed on getting link stats");
        return -1;
    }
    if (netStatus_ == NetStatus::kConnecting) {
        if (AssignConnectInfo() == -1) {
            NetDisconnect();
        }
        return 2;
    }
    if (netStatus_ == NetStatus::kConnected) {
        connectFailedAttempts_ = 0;
    }
    busy_ = false;
    return 1;
}

std::string USBModem::GetNetStatus(bool& err) {
    if (GetLinkStats() != 0) {
        TAVI_LOG_ERROR("failed on getting link stats");
        err = true;
        return "";
    }
    return NameOf(netStatus_);
}

bool USBModem::IsNetDisconnected(bool& err) {
    if (GetLinkStats() != 0) {
        TAVI_LOG_ERROR("failed on getting link stats");
        err = true;
        return false;
    }
    return netStatus_ == NetStatus::kDisconnected || netStatus_ == NetStatus::kConnectionLost;
}

}  // namespace taviwireless::usbmodem_lib
