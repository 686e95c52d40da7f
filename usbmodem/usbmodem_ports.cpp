// SPDX-License-Identifier: MIT
// Which of the modem's serial ports does what, and making a new record usable.
#include <tavicore/file.h>
#include <taviwireless/usbmodem.h>
#include <taviwireless/usbmodem_atif.h>

#include <fstream>
#include <sstream>

#include "base/interface_name.h"
#include "base/sleep_out.h"
#include "base/split.h"
#include "common/log.h"
#include "usbmodem/info_file.h"
#include "usbmodem/rules/dial_log.h"
#include "usbmodem/rules/paths.h"
#include "usbmodem/rules/status.h"
#include "usbmodem/text.h"

namespace taviwireless::usbmodem_lib {

namespace {

// A modem that was just plugged in may need a few seconds until its ports answer.
constexpr int kAttempts = 3;
constexpr unsigned int kAttemptPause = 1;  // seconds

// Calls assign until it succeeds, kAttempts times at most, with a pause after each failure.
template <typename Assign, typename LogFailure>
void Retry(Assign assign, LogFailure logFailure) {
    for (int attempt = 0; attempt < kAttempts && assign() != 0; ++attempt) {
        logFailure(attempt);
        SleepOut(kAttemptPause);
    }
}

}  // namespace

bool USBModem::ReadConnectNode() {
    const std::string number = ReadInfo(infoPath_, "CONNECTNODE");
    connectNode_ = number.empty() ? "" : kPortPrefix + number;
    if (number.empty()) {
        TAVI_LOG_ERROR("error on parsing CONNECTNODE from %s", infoPath_.c_str());
    }
    return !number.empty();
}

int USBModem::AssignConnectNode() {
    if (!ReadConnectNode()) {
        CloseFileDevice();
        return -1;
    }
    std::string reply;
    if (OpenFileDevice(connectNode_) != 0 || QuerySIMStatus(reply) != 0) {
        TAVI_LOG_ERROR("warning: cannot test CONNECTNODE %s", connectNode_.c_str());
    }
    CloseFileDevice();
    return 0;
}

int USBModem::AssignQuaryNode() {
    std::string reply;
    return FindQueryNode(reply) ? 0 : -1;
}

// The reply is that to the SIM status query.
bool USBModem::FindQueryNode(std::string& reply) {
    queryNode_.clear();
    const std::string numbers = ReadInfo(infoPath_, "DEVICENODE");
    if (numbers.empty()) {
        TAVI_LOG_ERROR("error on parsing DEVICENODE from %s", infoPath_.c_str());
        return false;
    }
    for (const std::string& number : Split(numbers, ',')) {
        const std::string node = kPortPrefix + number;
        if (node != connectNode_ && TryQueryNode(node, reply)) {
            return true;
        }
    }
    TAVI_LOG_ERROR("Cannot find any device for quary node");
    return false;
}

bool USBModem::TryQueryNode(const std::string& node, std::string& reply) {
    if (OpenFileDevice(node) != 0) {
        return false;
    }
    if (QuerySIMStatus(reply) != 0) {
        CloseFileDevice();
        return false;
    }
    queryNode_ = node;  // and its channel stays open for all that is asked later
    return true;
}

int USBModem::AssignConnectInfo() {
    const std::string path = DialLogPath(imsi_);
    if (VEXACFileExist(path.c_str()) != 1) {
        TAVI_LOG_ERROR("Error on file %s, not exist", path.c_str());
        return -1;
    }
    std::ifstream file(path);
    std::string log;
    for (std::string line; std::getline(file, line);) {
        log += line + '\n';
    }
    if (!file.is_open() || file.bad()) {
        TAVI_LOG_ERROR("Error on file open: %s", path.c_str());
        return -1;
    }
    if (Contains(log, "Disconnecting")) {
        return -1;
    }
    if (!Contains(log, "secondary DNS address")) {
        return 2;
    }
    const size_t named = dial_log::FindInterface(log);
    if (named == std::string::npos && Contains(log, dial_log::kUsingInterface)) {
        return 2;  // only the modem spoke of one
    }
    // Without "Using interface" this wraps to index 14 and reads a word of some other line.
    // Compatible with earlier releases, and harmless: the dialler names the interface before the
    // addresses, so it writes no such log.
    std::istringstream rest(log.substr(named + sizeof dial_log::kUsingInterface - 1));
    netIFName_.clear();
    rest >> netIFName_;
    if (!IsInterfaceName(netIFName_)) {
        netIFName_.clear();  // it would become an argument and a line of others
    }
    return 1;
}

int USBModem::InitInfo() {
    return CompleteInit(FindPortsAndPrepare());
}

int USBModem::FailInit() {
    initState_ = kInitFailed;
    CloseFileDevice();
    UnsetATInterface();
    return -1;
}

int USBModem::CompleteInit(bool isPrepared) {
    if (!isPrepared) {
        return FailInit();
    }
    AskForSIM();
    initState_ = kInited;
    return 0;
}

void USBModem::AskForSIM() {
    UpdateSIMStatus();
    if (simStatus_ == SimStatus::kBusy || simStatus_ == SimStatus::kError) {
        TAVI_LOG_ERROR("Warning: sim error or busy detected when init");
    } else if (simStatus_ == SimStatus::kUnknown) {
        TAVI_LOG_ERROR("Warning: unexpect sim result when init");
    }
}

bool USBModem::FindPortsAndPrepare() {
    SetATInterface();
    connectNode_.clear();
    Retry([this] { return AssignConnectNode(); },
          [](int attempt) {
              TAVI_LOG_ERROR("no respond when get connect node, sleep 1 sec [%d]", attempt);
          });
    if (connectNode_.empty()) {
        TAVI_LOG_ERROR("failed on parsing connect device node");
        return false;
    }
    queryNode_.clear();
    Retry([this] { return AssignQuaryNode(); },
          [](int attempt) {
              TAVI_LOG_ERROR("No respond on setting quary device node, wait 1 sec [%d]", attempt);
          });
    if (queryNode_.empty()) {
        TAVI_LOG_ERROR("failed on parsing quary device node");
        return false;
    }
    return Prepare();
}

bool USBModem::Prepare() {
    if (SetHardwareFuncLvl("1") != 0) {
        TAVI_LOG_ERROR("failed on setting hardware function lvl");
        return false;
    }
    if (SetUnsolicitedReports(false) < 0) {
        TAVI_LOG_ERROR("failed on disabling Unsolicited Reports");
        return false;
    }
    return true;
}

}  // namespace taviwireless::usbmodem_lib
