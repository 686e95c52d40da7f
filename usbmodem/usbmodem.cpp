// SPDX-License-Identifier: MIT
// The modem record: construction, copying, accessors, choice of the command set.
#include <tavicore/file.h>
#include <taviwireless/usbmodem.h>
#include <taviwireless/usbmodem_atif.h>

#include "common/log.h"
#include "usbmodem/info_file.h"
#include "usbmodem/rules/status.h"

namespace taviwireless::usbmodem_lib {

namespace {

constexpr int kMaxErrors = 5;

}  // namespace

USBModem::USBModem(unsigned int interfaceId, const std::string& infoPath)
    : interfaceId_(interfaceId),
      simStatus_(SimStatus::kUnknown),
      netStatus_(NetStatus::kDisconnected),
      infoPath_(infoPath),
      semaphore_(interfaceId) {}

USBModem::USBModem(const USBModem& other)
    : interfaceId_(other.interfaceId_),
      initState_(other.initState_),
      simStatus_(other.simStatus_),
      netStatus_(other.netStatus_),
      infoPath_(other.infoPath_),
      connectNode_(other.connectNode_),
      connectFailedAttempts_(other.connectFailedAttempts_),
      rssi_(other.rssi_),
      pinAttemptsRemaining_(other.pinAttemptsRemaining_),
      pukAttemptsRemaining_(other.pukAttemptsRemaining_),
      roaming_(other.roaming_),
      profilePath_(other.profilePath_),
      semaphore_(other.semaphore_),
      busy_(other.busy_),
      newPlugIn_(other.newPlugIn_),
      pinProtection_(other.pinProtection_),
      errorCounter_(other.errorCounter_),
      device_(other.device_),
      atInterface_(other.atInterface_) {}

USBModem& USBModem::operator=(const USBModem& other) = default;

// noexcept lets a growing vector move its records instead of copying them.
USBModem::USBModem(USBModem&& other) noexcept = default;
USBModem& USBModem::operator=(USBModem&& other) noexcept = default;

USBModem::~USBModem() = default;

std::string USBModem::GetDevId() const {
    return "usbmodem" + std::to_string(interfaceId_);
}

bool USBModem::IsNull() const {
    return false;
}

bool USBModem::IsInited() const {
    return initState_ == kInited;
}

bool USBModem::IsInfoExist() const {
    return VEXACFileExist(infoPath_.c_str()) == 1;
}

unsigned int USBModem::GetIfid() const {
    return interfaceId_;
}

bool USBModem::IsError() {
    return errorCounter_ > kMaxErrors;
}

int USBModem::IncreaseErrorCounter() {
    return ++errorCounter_;
}

bool USBModem::IsUSBModemBusy() {
    return busy_;
}

bool USBModem::IsNewPlugIn() {
    return newPlugIn_;
}

void USBModem::SetNotNewPlugIn() {
    newPlugIn_ = false;
}

int USBModem::GetConnectFailedAttempt() {
    return connectFailedAttempts_;
}

std::string USBModem::GetNetIFName(bool& /*err*/) {
    return netStatus_ == NetStatus::kConnected ? netIFName_ : "";
}

std::string USBModem::GetNetLocalIP(bool& /*err*/) {
    return netStatus_ == NetStatus::kConnected ? netLocalIP_ : "";
}

void USBModem::SetATInterface() {
    UnsetATInterface();
    const std::string vendorId = ReadInfo(infoPath_, "USB_ID_VENDOR");
    if (vendorId.empty()) {
        TAVI_LOG_ERROR("Cannot parsing USB_ID_VENDOR from %s", infoPath_.c_str());
    }
    atInterface_.reset(USBModem_ATIF::CreateATIF(vendorId), USBModem_ATIF::DeleteATIF);
}

void USBModem::UnsetATInterface() {
    atInterface_.reset();
}

// A record without a command set has no channel either, so nothing of it is ever sent.
USBModem_ATIF& USBModem::CommandSet() const {
    static USBModem_ATIF generic;
    return atInterface_ ? *atInterface_ : generic;
}

USBModemNull::USBModemNull() : USBModem(0, "") {}

USBModemNull::~USBModemNull() = default;

std::string USBModemNull::GetDevId() const {
    return "";
}

bool USBModemNull::IsNull() const {
    return true;
}

bool USBModemNull::IsInited() const {
    return false;
}

bool USBModemNull::IsInfoExist() const {
    return false;
}

}  // namespace taviwireless::usbmodem_lib
