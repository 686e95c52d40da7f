// SPDX-License-Identifier: MIT
#include "cli/wifi/network_name.h"

#include <algorithm>
#include <cctype>
#include <cstring>

namespace taviwireless::cli {

namespace {

bool HasFormOfBssid(const std::string& text) {
    constexpr size_t kLength = 17;
    for (size_t i = 0; i < text.size(); ++i) {
        const bool isRight =
            i % 3 == 2 ? text[i] == ':' : isxdigit(static_cast<unsigned char>(text[i])) != 0;
        if (!isRight) {
            return false;
        }
    }
    return text.size() == kLength;
}

}  // namespace

std::string BssidText(const unsigned char (&bssid)[6]) {
    const bool isKnown = std::any_of(std::begin(bssid), std::end(bssid), [](int b) { return b; });
    char text[18];
    return isKnown ? TAVIWirelessBssidStringGet(bssid, text, sizeof text) : "";
}

NetworkName::NetworkName(const std::string& text) : text_(text), isBssid_(HasFormOfBssid(text)) {
    if (isBssid_) {
        TAVIWirelessBssidParse(text.c_str(), bssid_);
    }
}

bool NetworkName::IsOf(const WirelessNetwork& network) const {
    return isBssid_ ? memcmp(network.bssid, bssid_, sizeof bssid_) == 0 : text_ == network.essid;
}

const void* NetworkName::Key() const {
    return isBssid_ ? static_cast<const void*>(bssid_) : text_.c_str();
}

}  // namespace taviwireless::cli
