// SPDX-License-Identifier: MIT
// The query port that is known: initialising a modem on it, and whether it is still there.
#include <poll.h>
#include <sys/stat.h>
#include <taviwireless/usbmodem.h>
#include <wvmodem.h>

#include "common/log.h"
#include "usbmodem/info_file.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::usbmodem_lib {

std::string USBModem::GetQueryNode() const {
    return queryNode_;
}

int USBModem::InitInfo(const std::string& queryNode) {
    SetATInterface();
    connectNode_ = kPortPrefix + ReadInfo(infoPath_, "CONNECTNODE");
    queryNode_ = queryNode;
    std::string reply;
    return CompleteInit(OpenFileDevice(queryNode) == 0 && QuerySIMStatus(reply) == 0 && Prepare());
}

bool USBModem::IsPortAlive() const {
    if (!device_ || !device_->isok()) {
        return false;
    }
    // A port that was taken away hangs up, and its path then leads nowhere or to a new port.
    pollfd port{device_->getrfd(), 0, 0};
    struct stat opened {};
    struct stat named {};
    return poll(&port, 1, 0) == 0 && fstat(port.fd, &opened) == 0 &&
           stat(queryNode_.c_str(), &named) == 0 && opened.st_rdev == named.st_rdev;
}

}  // namespace taviwireless::usbmodem_lib
