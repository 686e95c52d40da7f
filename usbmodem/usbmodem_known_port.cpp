// SPDX-License-Identifier: MIT
// The query port that is known: initialising a modem on it, here or for another process, and
// whether it is still there.
#include <poll.h>
#include <sys/stat.h>
#include <taviwireless/usbmodem.h>
#include <taviwireless/usbmodem_atif.h>
#include <wvmodem.h>

#include "base/split.h"
#include "common/log.h"
#include "usbmodem/info_file.h"
#include "usbmodem/rules/paths.h"
#include "usbmodem/rules/status.h"
#include "usbmodem/text.h"

namespace taviwireless::usbmodem_lib {

namespace {

// A lock that its holder never gives back is free for this process from now on: otherwise the first
// command would fail for it, and there is no second attempt.
void PassLock(semaphore::Semaphore& lock) {
    lock.Enter();
    lock.Release();
}

}  // namespace

std::string USBModem::GetQueryNode() const {
    return queryNode_;
}

int USBModem::InitInfo(const std::string& queryNode) {
    SetATInterface();
    ReadConnectNode();
    std::string reply;
    return CompleteInit(TryQueryNode(queryNode, reply) && Prepare());
}

int USBModem::MakeReady(std::string& findings) {
    PassLock(semaphore_);
    SetATInterface();
    std::string reply;
    if (!ReadConnectNode() || !FindQueryNode(reply) || !Prepare()) {
        return FailInit();
    }
    simStatus_ = SimStatus(CommandSet().ParseRetStringQuarySIMStatus(reply));
    if (simStatus_ != SimStatus::kReady) {
        AskForSIM();  // it may have become ready with full functionality
    }
    if (!KnowsItsSIM()) {
        return FailInit();
    }
    initState_ = kInited;
    findings = queryNode_ + '\n' + std::to_string(static_cast<int>(simStatus_)) + '\n' + imsi_;
    return 0;
}

// Otherwise the next look at a running connection would take its log for missing and end it. A SIM
// that waits for its PIN, or is missing, has nothing to tell and counts as known.
bool USBModem::KnowsItsSIM() {
    const int connection = RecallConnection();
    if (connection > 0) {
        return true;
    }
    if (simStatus_ != SimStatus::kReady) {
        return connection == 0 && simStatus_ != SimStatus::kUnknown;
    }
    bool failed = false;
    GetIMSI(failed);
    return !failed;
}

int USBModem::TakeOver(const std::string& findings) {
    const std::vector<std::string> values = Lines(findings);
    SetATInterface();
    ReadConnectNode();
    if (values.size() < 2 || OpenFileDevice(values[0]) != 0) {
        return FailInit();
    }
    PassLock(semaphore_);
    queryNode_ = values[0];
    simStatus_ = SimStatus(ToInt(values[1]));
    imsi_ = values.size() > 2 ? values[2] : "";
    initState_ = kInited;
    return 0;
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
