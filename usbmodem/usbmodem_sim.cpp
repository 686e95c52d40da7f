// SPDX-License-Identifier: MIT
// The lock state of the SIM: PIN, PUK and PIN protection.
#include <taviwireless/usbmodem.h>
#include <taviwireless/usbmodem_atif.h>

#include <algorithm>
#include <cctype>
#include <cstring>

#include "common/log.h"
#include "usbmodem/loggable.h"
#include "usbmodem/rules/status.h"
#include "usbmodem/text.h"

namespace taviwireless::usbmodem_lib {

namespace {

constexpr int kRefused = -1;
constexpr int kNotOK = -2;
constexpr int kBusy = 2;

// Whether code can stand in a command as it is. A modem takes what follows one of these characters
// for the next part of the line, or for a command of its own: "1234;D112;" dials.
bool FitsInCommand(const std::string& code) {
    constexpr char kEnds[] = "\",;";
    return std::none_of(code.begin(), code.end(), [&kEnds](unsigned char c) {
        return std::iscntrl(c) != 0 || std::strchr(kEnds, c) != nullptr;
    });
}

bool FitInCommand(const std::string& first, const std::string& second = "") {
    const bool isFit = FitsInCommand(first) && FitsInCommand(second);
    if (!isFit) {
        TAVI_LOG_ERROR("refused: a code with a quote, comma, semicolon or control character");
    }
    return isFit;
}

// Sends a command with these codes, which the modem is to answer with OK.
int Send(USBModem& modem, USBModem_ATIF& commands, const std::string& cmd,
         std::initializer_list<std::string> codes, const char* what, const char* doing) {
    std::string reply;
    if (modem.ModemCmd(cmd, reply) != 0) {
        TAVI_LOG_ERROR("error on modem cmd: %s", what);
        return kRefused;
    }
    if (commands.ParseRetStringIsOK(reply) != 0) {
        TAVI_LOG_ERROR("error on %s, ret: %s", doing, LoggableReply(reply, codes).c_str());
        return kNotOK;
    }
    return 0;
}

}  // namespace

int USBModem::QuerySIMStatus(std::string& reply) {
    return ModemCmd(CommandSet().GetATCommandQuarySIMStatus(), reply);
}

int USBModem::UpdateSIMStatus() {
    if (!busy_) {
        std::string reply;
        const bool isKnown = QuerySIMStatus(reply) == 0;
        simStatus_ = isKnown ? SimStatus(CommandSet().ParseRetStringQuarySIMStatus(reply))
                             : SimStatus::kUnknown;
    }
    switch (simStatus_) {
        case SimStatus::kReady:
            return 1;
        case SimStatus::kPINRequired:
        case SimStatus::kPUKRequired:
            return 0;
        case SimStatus::kBusy:
        case SimStatus::kError:
            return 2;
        default:
            TAVI_LOG_ERROR("error on getting PIN status");
            return -1;
    }
}

std::string USBModem::GetPINStatus(bool& err) {
    if (UpdateSIMStatus() < 0) {
        TAVI_LOG_ERROR("error value on PINStatus, %d", static_cast<int>(simStatus_));
        err = true;
    }
    return NameOf(simStatus_);
}

bool USBModem::IsPINReady(bool& err) {
    if (simStatus_ != SimStatus::kReady && simStatus_ != SimStatus::kPINRequired &&
        simStatus_ != SimStatus::kPUKRequired) {
        TAVI_LOG_ERROR("error SIM stats, PIN is not ready");
        err = true;
    }
    return simStatus_ == SimStatus::kReady;
}

int USBModem::GetPINEnable() {
    if (busy_) {
        return 0;
    }
    const std::string cmd = CommandSet().GetATCommandGetPINEnable();
    std::string reply;
    if (ModemCmd(cmd, reply) != 0) {
        TAVI_LOG_ERROR("error on modem cmd %s", cmd.c_str());
        return -1;
    }
    if (Contains(reply, "+CLCK: 1")) {
        pinProtection_ = 1;
    } else if (Contains(reply, "+CLCK: 0")) {
        pinProtection_ = 0;
    } else {
        pinProtection_ = Contains(reply, "+CME ERROR: SIM PIN required") ? 1 : -1;
    }
    return pinProtection_;
}

int USBModem::PINGetEnableProtection() {
    return GetPINEnable();
}

int USBModem::ChangePINEnable(const std::string& pin, bool enable) {
    if (busy_) {
        return kBusy;
    }
    if (simStatus_ != SimStatus::kReady) {
        TAVI_LOG_ERROR("Cannot change enable when SIM is not ready");
        return kRefused;
    }
    if (!FitInCommand(pin)) {
        return kRefused;
    }
    const int current = GetPINEnable();
    if (current < 0) {
        TAVI_LOG_ERROR("error on getting current PIN enable setting");
        return kRefused;
    }
    if ((current == 1) == enable) {
        return 0;
    }
    const int result =
        Send(*this, CommandSet(), CommandSet().GetATCommandChangePINEnable(enable ? "1" : "0", pin),
             {pin}, "enable pin protection", "enable PIN protection");
    if (result == 0) {
        pinProtection_ = enable ? 1 : 0;
    }
    return result;
}

int USBModem::ChangePIN(const std::string& oldPin, const std::string& newPin) {
    if (busy_) {
        return kBusy;
    }
    if (simStatus_ != SimStatus::kReady) {
        TAVI_LOG_ERROR("Cannot change PIN when SIM is not ready");
        return kRefused;
    }
    if (oldPin.empty() || newPin.empty()) {
        TAVI_LOG_ERROR("error on change pin: input args should not be null");
        return kRefused;
    }
    if (!FitInCommand(oldPin, newPin)) {
        return kRefused;
    }
    return Send(*this, CommandSet(), CommandSet().GetATCommandChangePINCode(oldPin, newPin),
                {oldPin, newPin}, "change pin", "changing PIN");
}

int USBModem::PINSet(const std::string& pin, const std::string& newPin, bool enable) {
    newPlugIn_ = false;
    int result = FitInCommand(pin, newPin) ? ChangePINEnable(pin, enable) : kRefused;
    if (result != 0) {
        TAVI_LOG_ERROR("failed on PIN enable");
    } else if (!newPin.empty()) {
        result = ChangePIN(pin, newPin);
        if (result != 0) {
            TAVI_LOG_ERROR("failed on change PIN");
        }
    }
    UpdateSIMStatus();
    return result;
}

int USBModem::PINUnlock(const std::string& pin) {
    newPlugIn_ = false;
    const int result = busy_ ? kBusy : EnterPIN(pin);
    UpdateSIMStatus();
    return result;
}

int USBModem::EnterPIN(const std::string& pin) {
    if (!FitInCommand(pin)) {
        return kRefused;
    }
    std::string reply;
    if (QuerySIMStatus(reply) != 0) {
        TAVI_LOG_ERROR("error on checking PIN stats, ret: %s", reply.c_str());
        return kRefused;
    }
    if (Contains(reply, "+CPIN: READY")) {
        return 0;
    }
    if (ModemCmd(CommandSet().GetATCommandSetSIMPIN(pin), reply) != 0) {
        TAVI_LOG_ERROR("error on entering PIN, ret: %s", LoggableReply(reply, {pin}).c_str());
        return kRefused;
    }
    if (CommandSet().ParseRetStringIsOK(reply) != 0) {
        TAVI_LOG_ERROR("Cannot find OK in respond of PIN unlock, ret: %s",
                       LoggableReply(reply, {pin}).c_str());
        return kNotOK;
    }
    return 0;
}

int USBModem::ChangePINWithPUK(const std::string& puk, const std::string& newPin) {
    newPlugIn_ = false;
    const int result = busy_ ? kBusy : EnterPUK(puk, newPin);
    UpdateSIMStatus();
    return result;
}

int USBModem::EnterPUK(const std::string& puk, const std::string& newPin) {
    if (simStatus_ != SimStatus::kPUKRequired) {
        TAVI_LOG_ERROR("Cannot set PUK at this SIM stat");
        return kRefused;
    }
    if (!FitInCommand(puk, newPin)) {
        return kRefused;
    }
    return Send(*this, CommandSet(), CommandSet().GetATCommandSetSIMPUK(puk, newPin), {puk, newPin},
                "change pin with puk", "changing pin with puk");
}

int USBModem::PUKSet(const std::string& puk, const std::string& newPin) {
    return ChangePINWithPUK(puk, newPin);
}

int USBModem::PINGetAttemptRemain() {
    return AttemptRemain(&USBModem_ATIF::ParseRetStringPINRemainAttempt, pinAttemptsRemaining_);
}

int USBModem::PUKGetAttemptRemain() {
    return AttemptRemain(&USBModem_ATIF::ParseRetStringPUKRemainAttempt, pukAttemptsRemaining_);
}

int USBModem::AttemptRemain(Parser parser, int& cache) {
    if (busy_ || simStatus_ >= SimStatus::kBusy) {
        return cache;
    }
    std::string count;
    if (!Refresh(&USBModem_ATIF::GetATCommandPINPUKAttempt, parser, count, [](const char* reply) {
            TAVI_LOG_ERROR("error on parsing AT command ret string: %s", reply);
        })) {
        return -1;
    }
    cache = ToInt(count);
    return cache;
}

}  // namespace taviwireless::usbmodem_lib
