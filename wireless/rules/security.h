// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_SECURITY_H
#define TAVIWIRELESS_WIRELESS_RULES_SECURITY_H

#include <taviwireless/wireless.h>

#include <optional>
#include <string>

namespace taviwireless::wireless {

// What a network wants of who joins it.
enum class Security {
    kOpen,
    kWEP,  // a key of fixed length
    kWPA,  // a pass phrase
    kEAP,  // user and password
    kUnknown
};

Security SecurityOf(const WirelessNetwork& network);

// The length of a WEP key tells its form: 5 or 13 characters, or 10 or 26 hexadecimal digits.
bool IsWepText(const std::string& key);
bool IsWepHexadecimal(const std::string& key);

// The value of "wep_key0", which hostapd and the supplicant read alike; nothing when the key has
// the length of none.
std::optional<std::string> WepKeyValue(const std::string& key);

// Whether a network of this security can have the key, or its user the password: for those who
// enter one. What is stored already is used as it stands.
bool IsKey(Security security, const std::string& key);

}  // namespace taviwireless::wireless

#endif
