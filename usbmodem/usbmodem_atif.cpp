// SPDX-License-Identifier: MIT
#include <taviwireless/usbmodem_atif.h>

#include <algorithm>
#include <mutex>

#include "base/split.h"
#include "common/log.h"
#include "usbmodem/loggable.h"
#include "usbmodem/rules/status.h"
#include "usbmodem/text.h"

namespace taviwireless::usbmodem_lib {

namespace {

std::string Quoted(const std::string& text) {
    return '"' + text + '"';
}

}  // namespace

std::string USBModem_ATIF::GetATCommandQuarySIMStatus() {
    return "AT+CPIN?";
}

std::string USBModem_ATIF::GetATCommandSetSIMPIN(const std::string& pin) {
    return "AT+CPIN=" + pin;
}

std::string USBModem_ATIF::GetATCommandSetSIMPUK(const std::string& puk,
                                                 const std::string& newPin) {
    return "AT+CPIN=" + puk + "," + newPin;
}

std::string USBModem_ATIF::GetATCommandChangePINCode(const std::string& oldPin,
                                                     const std::string& newPin) {
    return "AT+CPWD=\"SC\"," + Quoted(oldPin) + "," + Quoted(newPin);
}

std::string USBModem_ATIF::GetATCommandChangePINEnable(const std::string& lockMode,
                                                       const std::string& pin) {
    return "AT+CLCK=\"SC\"," + lockMode + "," + Quoted(pin);
}

std::string USBModem_ATIF::GetATCommandGetPINEnable() {
    return "AT+CLCK=\"SC\",2";
}

std::string USBModem_ATIF::GetATCommandGetRSSI() {
    return "AT+CSQ";
}

std::string USBModem_ATIF::GetATCommandGetHardwareFuncLvl() {
    return "AT+CFUN?";
}

std::string USBModem_ATIF::GetATCommandSetHardwareFuncLvl(const std::string& level) {
    return "AT+CFUN=" + level;
}

std::string USBModem_ATIF::GetATCommandGetVendorName() {
    return "AT+CGMI";
}

std::string USBModem_ATIF::GetATCommandGetProductName() {
    return "AT+CGMM";
}

std::string USBModem_ATIF::GetATCommandGetIMSI() {
    return "AT+CIMI";
}

std::string USBModem_ATIF::GetATCommandGetRoaming() {
    return "AT+CREG?";
}

std::string USBModem_ATIF::GetATCommandGetDefaultISP() {
    return "AT+COPS?";
}

std::string USBModem_ATIF::GetATCommandGetDefaultAPN() {
    return "AT+CGDCONT?";
}

std::string USBModem_ATIF::GetATCommandPINPUKAttempt() {
    return "AT+EPINC?";
}

std::string USBModem_ATIF::GetATCommandGetUnsolicitedReports() {
    return "";
}

std::string USBModem_ATIF::GetATCommandSetUnsolicitedReports(bool /*enable*/) {
    return "";
}

int USBModem_ATIF::ParseRetStringQuarySIMStatus(const std::string& reply) {
    // The order matters: a reply may hold more than one of these.
    static constexpr struct {
        const char* text;
        SimStatus status;
    } kStatuses[] = {
        {"+CPIN: READY", SimStatus::kReady},
        {"+CPIN: SIM PIN", SimStatus::kPINRequired},
        {"+CPIN: SIM PUK", SimStatus::kPUKRequired},
        {"BUSY", SimStatus::kBusy},
        {"ERROR", SimStatus::kError},
        {"failure", SimStatus::kError},
    };
    for (const auto& candidate : kStatuses) {
        if (Contains(reply, candidate.text)) {
            return static_cast<int>(candidate.status);
        }
    }
    return static_cast<int>(SimStatus::kUnknown);
}

int USBModem_ATIF::ParseRetStringGetRSSI(const std::string& reply, std::string& result) {
    return GetLineWithDelim(reply, ',', 1, result);
}

int USBModem_ATIF::ParseRetStringGetRoaming(const std::string& reply, std::string& result) {
    std::string status;
    if (GetLineWithDelim(reply, ',', 2, status) != 0) {
        return -1;
    }
    // The field reaches to the end of the reply where no further comma follows, and is then not
    // equal: only a status with location fields behind it counts as roaming.
    result = status == "5" ? "true" : "false";
    return 0;
}

int USBModem_ATIF::ParseRetStringPINRemainAttempt(const std::string& reply, std::string& result) {
    return GetLineWithDelim(reply, ',', 1, result);
}

int USBModem_ATIF::ParseRetStringPUKRemainAttempt(const std::string& reply, std::string& result) {
    return GetLineWithDelim(reply, ',', 3, result);
}

int USBModem_ATIF::ParseRetStringDefaultISP(const std::string& reply, std::string& result) {
    return GetLineWithDelim(reply, '"', 2, result);
}

int USBModem_ATIF::ParseRetStringDefaultAPN(const std::string& reply, std::string& result) {
    return GetLineWithDelim(reply, '"', 4, result);
}

int USBModem_ATIF::ParseRetStringDefaultFormat(const std::string& reply, std::string& result) {
    if (reply.empty()) {
        TAVI_LOG_ERROR("error on input string for parsing should not be empty");
        return -1;
    }
    if (Contains(reply, "ERROR")) {
        TAVI_LOG_ERROR("error on input string: %s", LoggableReply(reply).c_str());
        return -1;
    }
    const size_t colon = reply.find(':');
    const size_t begin = colon == std::string::npos ? 0 : colon + 1;
    result = reply.substr(begin, reply.find('\n', begin) - begin);
    return 0;
}

int USBModem_ATIF::ParseRetStringIsOK(const std::string& reply) {
    if (reply.empty()) {
        TAVI_LOG_ERROR("error on input string for parsing should not be empty");
        return -1;
    }
    return !Contains(reply, "ERROR") && Contains(reply, "OK") ? 0 : -1;
}

USBModem_ATIF::~USBModem_ATIF() = default;

int USBModem_ATIF::GetLineWithDelim(const std::string& reply, char delim, int field,
                                    std::string& result) {
    if (reply.empty() || field <= 0) {
        TAVI_LOG_ERROR("error on input args of GetLineWithDelim");
        return -1;
    }
    if (Contains(reply, "ERROR")) {
        TAVI_LOG_ERROR("error on input string: %s", LoggableReply(reply).c_str());
        return -1;
    }
    const size_t colon = std::min(reply.find(':'), reply.size() - 1);
    const std::vector<std::string> fields = Split(reply.substr(colon + 1), delim);
    const auto index = static_cast<size_t>(field) - 1;
    result = index < fields.size() ? fields[index] : "";
    return 0;
}

std::map<std::string, USBModem_ATIF::Creator> USBModem_ATIF::vendorTable;

int USBModem_ATIF::CreateVendorHash() {
    vendorTable["12d1"] = CreateATIFHuawei;
    vendorTable["2001"] = CreateATIFDLink;
    return 0;
}

USBModem_ATIF* USBModem_ATIF::CreateATIF(const std::string& vendorId) {
    static std::once_flag filled;
    std::call_once(filled, CreateVendorHash);
    const auto vendor = vendorTable.find(vendorId);
    if (vendor == vendorTable.end()) {
        TAVI_LOG_ERROR("Unknown vendor id %s, assign default ATIF", vendorId.c_str());
        return new USBModem_ATIF;
    }
    return vendor->second();
}

void USBModem_ATIF::DeleteATIF(USBModem_ATIF* commandSet) {
    delete commandSet;
}

}  // namespace taviwireless::usbmodem_lib
