// SPDX-License-Identifier: MIT
#include "cli/adapter/credentials.h"

#include "cli/command_error.h"
#include "cli/terminal.h"
#include "wireless/rules/line_break.h"

namespace taviwireless::cli {

namespace {

struct SecurityWord {
    const char* word;
    WirelessAuth auth;
    WirelessEncrypt encrypt;
};
// Both ciphers where a network may use either.
constexpr SecurityWord kSecurityWords[] = {
    {"open", WIRELESS_AUTH_OPEN, WIRELESS_ENCRYPT_NONE},
    {"wep", WIRELESS_AUTH_WEP_AUTO, WIRELESS_ENCRYPT_WEP},
    {"wpa", WIRELESS_AUTH_WPA_PSK, WIRELESS_ENCRYPT_TKIP_AES},
    {"wpa2", WIRELESS_AUTH_WPA2_PSK, WIRELESS_ENCRYPT_TKIP_AES},
    {"wpa-eap", WIRELESS_AUTH_WPA_EAP, WIRELESS_ENCRYPT_TKIP_AES},
    {"wpa2-eap", WIRELESS_AUTH_WPA2_EAP, WIRELESS_ENCRYPT_TKIP_AES},
};

// The form in which some access points show their key.
bool IsPreSharedKey(const std::string& key) {
    constexpr size_t kDigits = 64;
    return key.size() == kDigits &&
           key.find_first_not_of("0123456789abcdefABCDEF") == std::string::npos;
}

const char* FormOf(Security security) {
    switch (security) {
        case Security::kWEP:
            return "a WEP key has 5 or 13 characters, or 10 or 26 hexadecimal digits";
        case Security::kWPA:
            return "a WPA key has 8 to 63 printable characters";
        default:
            return "a password has 1 to 256 printable characters";
    }
}

}  // namespace

const std::vector<std::string>& SecurityWords() {
    static const std::vector<std::string> words = [] {
        std::vector<std::string> all;
        for (const SecurityWord& known : kSecurityWords) {
            all.emplace_back(known.word);
        }
        return all;
    }();
    return words;
}

void SetSecurity(WirelessNetwork& network, const std::string& word) {
    for (const SecurityWord& known : kSecurityWords) {
        if (word == known.word) {
            network.auth = known.auth;
            network.encrypt = known.encrypt;
        }
    }
}

void CheckEssid(const std::string& essid) {
    if (essid.empty() || essid.size() >= WIRELESS_ESSID_SIZE) {
        throw CommandError(kUsage, "the name of a network has 1 to 32 bytes");
    }
    if (wireless::HoldsLineBreak(essid)) {
        throw CommandError(kUsage, "the name of a network may not hold a line break");
    }
}

void CheckKey(Security security, const std::string& key) {
    if (security == Security::kWPA && IsPreSharedKey(key)) {
        throw CommandError(kUsage,
                           "64 hexadecimal digits are the key that a pass phrase makes, "
                           "and this system can keep pass phrases alone: give that one; "
                           "nothing was tried");
    }
    if (!wireless::IsKey(security, key)) {
        throw CommandError(kUsage, std::string(FormOf(security)) + "; nothing was tried");
    }
}

void CheckUser(const std::string& user) {
    if (user.size() >= WIRELESS_KEY_SIZE || wireless::HoldsLineBreak(user)) {
        throw CommandError(kUsage, "a user name has at most 256 bytes and no line break");
    }
}

std::string ReadKey(Security security, const std::string& essid) {
    const char* what = security == Security::kEAP ? "Password for " : "Key of ";
    const std::string key = ReadSecret(what + Printable(essid));
    CheckKey(security, key);
    return key;
}

}  // namespace taviwireless::cli
