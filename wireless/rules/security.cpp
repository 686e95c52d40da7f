// SPDX-License-Identifier: MIT
#include "wireless/rules/security.h"

#include <algorithm>

namespace taviwireless::wireless {

namespace {

constexpr char kHexDigits[] = "0123456789abcdefABCDEF";

// A password may be UTF-8 text.
bool IsAllowed(Security security, unsigned char c) {
    return c >= ' ' && c != 0x7F && (c < 0x80 || security == Security::kEAP);
}

}  // namespace

Security SecurityOf(const WirelessNetwork& network) {
    switch (network.auth) {
        case WIRELESS_AUTH_WPA_EAP:
        case WIRELESS_AUTH_WPA2_EAP:
            return Security::kEAP;
        case WIRELESS_AUTH_WPA_PSK:
        case WIRELESS_AUTH_WPA2_PSK:
            return Security::kWPA;
        case WIRELESS_AUTH_SHARED:
        case WIRELESS_AUTH_WEP_AUTO:
            return Security::kWEP;
        case WIRELESS_AUTH_OPEN:
            return network.encrypt == WIRELESS_ENCRYPT_WEP ? Security::kWEP : Security::kOpen;
        default:
            return Security::kUnknown;
    }
}

bool IsWepText(const std::string& key) {
    return key.size() == 5 || key.size() == 13;
}

bool IsWepHexadecimal(const std::string& key) {
    return key.size() == 10 || key.size() == 26;
}

std::optional<std::string> WepKeyValue(const std::string& key) {
    if (IsWepText(key)) {
        return '"' + key + '"';
    }
    return IsWepHexadecimal(key) ? std::make_optional(key) : std::nullopt;
}

bool IsKey(Security security, const std::string& key) {
    const bool isText = std::all_of(key.begin(), key.end(),
                                    [security](unsigned char c) { return IsAllowed(security, c); });
    switch (security) {
        case Security::kWEP:
            return isText && (IsWepText(key) || (IsWepHexadecimal(key) &&
                                                 key.find_first_not_of(kHexDigits) == key.npos));
        case Security::kWPA:
            return isText && key.size() >= 8 && key.size() <= 63;
        default:
            return isText && !key.empty() && key.size() < WIRELESS_KEY_SIZE;
    }
}

}  // namespace taviwireless::wireless
