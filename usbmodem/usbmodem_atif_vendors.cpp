// SPDX-License-Identifier: MIT
// What the modems of single vendors do differently from the standard.
#include <taviwireless/usbmodem_atif.h>

namespace taviwireless::usbmodem_lib {

USBModem_ATIF* USBModem_ATIF::CreateATIFDLink() {
    return new USBModem_ATIF_DLink;
}

std::string USBModem_ATIF_DLink::GetATCommandSetSIMPIN(const std::string& pin) {
    return "AT+CPIN=\"" + pin + "\"";
}

std::string USBModem_ATIF_DLink::GetATCommandSetSIMPUK(const std::string& puk,
                                                       const std::string& newPin) {
    return "AT+CPIN=\"" + puk + "\",\"" + newPin + "\"";
}

std::string USBModem_ATIF_DLink::GetATCommandPINPUKAttempt() {
    return "AT+EPINC?";
}

USBModem_ATIF* USBModem_ATIF::CreateATIFHuawei() {
    return new USBModem_ATIF_Huawei;
}

std::string USBModem_ATIF_Huawei::GetATCommandPINPUKAttempt() {
    return "AT^CPIN?";
}

std::string USBModem_ATIF_Huawei::GetATCommandGetUnsolicitedReports() {
    return "AT^CURC?";
}

std::string USBModem_ATIF_Huawei::GetATCommandSetUnsolicitedReports(bool enable) {
    return enable ? "AT^CURC=1" : "AT^CURC=0";
}

int USBModem_ATIF_Huawei::ParseRetStringPINRemainAttempt(const std::string& reply,
                                                         std::string& result) {
    return GetLineWithDelim(reply, ',', 4, result);
}

}  // namespace taviwireless::usbmodem_lib
