// SPDX-License-Identifier: MIT
#include "sim/sim_card.h"

#include <algorithm>
#include <stdexcept>

namespace taviwireless::sim {
namespace {

bool AreDigits(const std::string& text, size_t least, size_t most) {
    return text.size() >= least && text.size() <= most &&
           text.find_first_not_of("0123456789") == std::string::npos;
}

bool IsPin(const std::string& text) {
    return AreDigits(text, 4, 8);
}

int ParseAttempts(const std::string& value) {
    if (!AreDigits(value, 1, 2)) {
        throw std::invalid_argument("attempts are a number from 0 to 99, not '" + value + "'");
    }
    return std::stoi(value);
}

std::string ParseCode(const std::string& value, size_t least) {
    if (!AreDigits(value, least, 8)) {
        throw std::invalid_argument("a PIN has 4 to 8 digits and a PUK has 8, unlike '" + value +
                                    "'");
    }
    return value;
}

bool ParseSwitch(const std::string& value) {
    if (value != "on" && value != "off") {
        throw std::invalid_argument("lock is on or off, not '" + value + "'");
    }
    return value == "on";
}

std::string ParsePresence(const std::string& value) {
    for (const char* known : {"ready", "absent", "busy", "failure"}) {
        if (value == known) {
            return value;
        }
    }
    throw std::invalid_argument("sim is ready, absent, busy or failure, not '" + value + "'");
}

}  // namespace

bool SimCard::Set(const std::string& name, const std::string& value) {
    if (name == "pin") {
        pin_ = ParseCode(value, 4);
    } else if (name == "puk") {
        puk_ = ParseCode(value, 8);
    } else if (name == "pin_attempts") {
        pinAttempts_ = ParseAttempts(value);
    } else if (name == "puk_attempts") {
        pukAttempts_ = ParseAttempts(value);
    } else if (name == "lock") {
        protected_ = ParseSwitch(value);
    } else if (name == "sim") {
        presence_ = ParsePresence(value);
    } else {
        return false;
    }
    return true;
}

std::string SimCard::Missing(SimNeed need) const {
    if (need == SimNeed::kNothing) {
        return "";
    }
    if (presence_ != "ready") {
        return "sim_" + presence_;
    }
    if (pukAttempts_ == 0) {
        return "sim_blocked";
    }
    if (need == SimNeed::kCard) {
        return "";
    }
    return NeedsPuk() ? "sim_puk" : NeedsPin() ? "sim_pin" : "";
}

std::string SimCard::StateText() const {
    return NeedsPuk() ? "SIM PUK" : NeedsPin() ? "SIM PIN" : "READY";
}

std::string SimCard::CheckPin(const std::string& pin) {
    if (!IsPin(pin)) {
        return "bad_argument";  // refused before it reaches the card, so no attempt is lost
    }
    if (pin != pin_) {
        pinAttempts_ = std::max(0, pinAttempts_ - 1);
        return "wrong_password";
    }
    pinAttempts_ = kPinAttempts;
    return "";
}

std::string SimCard::EnterPin(const std::string& pin) {
    if (NeedsPuk()) {
        return "sim_puk";
    }
    if (!NeedsPin()) {
        return "not_allowed";
    }
    std::string error = CheckPin(pin);
    verified_ = error.empty();
    return error;
}

std::string SimCard::EnterPuk(const std::string& puk, const std::string& newPin) {
    if (!NeedsPuk()) {
        return "not_allowed";
    }
    if (!AreDigits(puk, 8, 8) || !IsPin(newPin)) {
        return "bad_argument";
    }
    if (puk != puk_) {
        pukAttempts_ = std::max(0, pukAttempts_ - 1);
        return "wrong_password";
    }
    pin_ = newPin;
    pinAttempts_ = kPinAttempts;
    pukAttempts_ = kPukAttempts;
    verified_ = true;
    return "";
}

std::string SimCard::ChangePin(const std::string& oldPin, const std::string& newPin) {
    if (!protected_) {
        return "not_allowed";  // a card takes a new PIN only while it is protected
    }
    if (!IsPin(newPin)) {
        return "bad_argument";
    }
    std::string error = CheckPin(oldPin);
    if (error.empty()) {
        pin_ = newPin;
    }
    return error;
}

std::string SimCard::SetProtection(bool on, const std::string& pin) {
    std::string error = CheckPin(pin);
    if (error.empty()) {
        protected_ = on;
        verified_ = true;
    }
    return error;
}

}  // namespace taviwireless::sim
