// SPDX-License-Identifier: MIT
#include "usbmodem/profile_value.h"

#include <algorithm>

#include "common/log.h"
#include "usbmodem/rules/profile.h"

namespace taviwireless::usbmodem_lib {

namespace {

// What ends a quoted APN, a number to dial, and with it the command.
bool EndsItsPlace(const std::string& key, const std::string& value) {
    const bool isNumber = key == profile::kNumber;
    const auto ends = [isNumber](unsigned char c) {
        return c < ' ' || c == 0x7F || c == '"' || (isNumber && c == ';');
    };
    return (isNumber || key == profile::kAPN) && std::any_of(value.begin(), value.end(), ends);
}

// Null when there is none.
const char* ReasonToRefuse(const std::string& key, const std::string& value) {
    if (value.size() >= profile::kValueSize) {
        return "it is too long";
    }
    if (value.find_first_of(profile::kLineEnds) != std::string::npos) {
        return "it holds a line break or a zero byte";
    }
    return EndsItsPlace(key, value) ? "it would end its place in the modem's command" : nullptr;
}

}  // namespace

bool IsProfileValue(const std::string& key, const std::string& value) {
    const char* reason = ReasonToRefuse(key, value);
    if (reason != nullptr) {
        TAVI_LOG_ERROR("refused a value for %s of the profile: %s", key.c_str(), reason);
    }
    return reason == nullptr;
}

}  // namespace taviwireless::usbmodem_lib
