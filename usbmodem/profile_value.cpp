#include "usbmodem/profile_value.h"

#include <algorithm>
#include <string_view>

#include "common/log.h"

namespace taviwireless::usbmodem_lib {

namespace {

constexpr std::string_view kLineEnds("\r\n\0", 3);

// What ends a quoted APN, a number to dial, and with it the command.
bool EndsItsPlace(const std::string& key, const std::string& value) {
    const bool isNumber = key == "number";
    const auto ends = [isNumber](unsigned char c) {
        return c < ' ' || c == 0x7F || c == '"' || (isNumber && c == ';');
    };
    return (isNumber || key == "apn") && std::any_of(value.begin(), value.end(), ends);
}

// Null when there is none.
const char* ReasonToRefuse(const std::string& key, const std::string& value) {
    if (value.size() >= kProfileValueSize) {
        return "it is too long";
    }
    if (value.find_first_of(kLineEnds) != std::string::npos) {
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
