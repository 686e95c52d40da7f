// SPDX-License-Identifier: MIT
// The vocabularies: the names that are understood, and the one of each value that is printed, which
// need not be understood. Where a value has several names, they are those of drivers, tools and
// configuration files.
#include <taviwireless/wireless.h>

namespace taviwireless::wireless {

namespace {

// Returns the name at the value's place; for other values that of the unknown one.
template <size_t kSize>
const char* NameOf(const char* const (&names)[kSize], int value, int unknown) {
    const bool isNamed = value >= 0 && static_cast<size_t>(value) < kSize;
    return names[isNamed ? value : unknown];
}

}  // namespace

}  // namespace taviwireless::wireless

// The mixed kinds count as WPA2, which access points that offer both prefer.
const WirelessNameValue gWirelessAuths[WIRELESS_AUTH_NAMES] = {
    {"UNKNOW", WIRELESS_AUTH_UNKNOWN},       {"OPEN", WIRELESS_AUTH_OPEN},
    {"SHARED", WIRELESS_AUTH_SHARED},        {"WEPAUTO", WIRELESS_AUTH_WEP_AUTO},
    {"AUTOWEP", WIRELESS_AUTH_WEP_AUTO},     {"WPA", WIRELESS_AUTH_WPA_PSK},
    {"WPAPSK", WIRELESS_AUTH_WPA_PSK},       {"WPA1", WIRELESS_AUTH_WPA_PSK},
    {"WPA1PSK", WIRELESS_AUTH_WPA_PSK},      {"WPANONE", WIRELESS_AUTH_WPA_NONE},
    {"WPA2", WIRELESS_AUTH_WPA2_PSK},        {"WPA2PSK", WIRELESS_AUTH_WPA2_PSK},
    {"WPA1WPA2", WIRELESS_AUTH_WPA2_PSK},    {"WPA1PSKWPA2PSK", WIRELESS_AUTH_WPA2_PSK},
    {"WPA1WPA2PSK", WIRELESS_AUTH_WPA2_PSK}, {"WPAEAP", WIRELESS_AUTH_WPA_EAP},
    {"WPA1EAP", WIRELESS_AUTH_WPA_EAP},      {"WPA2EAP", WIRELESS_AUTH_WPA2_EAP},
    {"WPA1WPA2EAP", WIRELESS_AUTH_WPA2_EAP},
};

const char* TAVIWirelessAuthStringGet(int auth) {
    constexpr const char* kNames[] = {"unknown", "OPEN",    "SHARED", "WEPAUTO", "WPAPSK",
                                      "WPA2PSK", "WPANONE", "WPAEAP", "WPA2EAP"};
    return taviwireless::wireless::NameOf(kNames, auth, WIRELESS_AUTH_UNKNOWN);
}

const WirelessNameValue gWirelessEncrypts[WIRELESS_ENCRYPT_NAMES] = {
    {"UNKNOW", WIRELESS_ENCRYPT_UNKNOWN},    {"NONE", WIRELESS_ENCRYPT_NONE},
    {"WEP", WIRELESS_ENCRYPT_WEP},           {"TKIP", WIRELESS_ENCRYPT_TKIP},
    {"AES", WIRELESS_ENCRYPT_AES},           {"TKIPAES", WIRELESS_ENCRYPT_TKIP_AES},
    {"TKIP AES", WIRELESS_ENCRYPT_TKIP_AES},
};

const char* TAVIWirelessEncryptStringGet(int encrypt, int ccmpNames) {
    switch (encrypt) {
        case WIRELESS_ENCRYPT_NONE:
            return "none";
        case WIRELESS_ENCRYPT_WEP:
            return "WEP";
        case WIRELESS_ENCRYPT_TKIP:
            return "TKIP";
        case WIRELESS_ENCRYPT_AES:
            return ccmpNames != 0 ? "CCMP" : "AES";
        case WIRELESS_ENCRYPT_TKIP_AES:
            return ccmpNames != 0 ? "TKIP CCMP" : "TKIP AES";
        default:
            return "unknown";
    }
}

const WirelessNameValue gWirelessOpmodes[WIRELESS_OPMODE_NAMES] = {
    {"Auto", WIRELESS_OPMODE_AUTO},         {"Ad-Hoc", WIRELESS_OPMODE_ADHOC},
    {"Managed", WIRELESS_OPMODE_MANAGED},   {"Master", WIRELESS_OPMODE_MASTER},
    {"Repeater", WIRELESS_OPMODE_REPEATER}, {"Secondary", WIRELESS_OPMODE_SECONDARY},
    {"Monitor", WIRELESS_OPMODE_MONITOR},   {"Unknown/bug", WIRELESS_OPMODE_UNKNOWN},
    {"In", WIRELESS_OPMODE_MANAGED},        {"Ad", WIRELESS_OPMODE_ADHOC},
    {"Infra", WIRELESS_OPMODE_MANAGED},     {"Adhoc", WIRELESS_OPMODE_ADHOC},
    {"Any", WIRELESS_OPMODE_MANAGED},
};

const char* TAVIWirelessOpmodeStringGet(int opmode) {
    // Compatible with what was printed before: "Secondeary", which does not parse back.
    constexpr const char* kNames[] = {"Auto",     "Ad-Hoc",     "Managed", "Master",
                                      "Repeater", "Secondeary", "Monitor", "Unknown"};
    return taviwireless::wireless::NameOf(kNames, opmode, WIRELESS_OPMODE_UNKNOWN);
}

// Sets that only newer adapters report, such as "11g", can be printed and have no entry here.
const WirelessNameValue gWirelessProtocols[WIRELESS_PROTOCOL_NAMES] = {
    {"unknown", WIRELESS_PROTOCOL_UNKNOWN},
    {"11b", WIRELESS_PROTOCOL_B},
    {"11a", WIRELESS_PROTOCOL_A},
    {"11a/n", WIRELESS_PROTOCOL_AN},
    {"11b/g", WIRELESS_PROTOCOL_BG},
    {"11b/g/n", WIRELESS_PROTOCOL_BGN},
    {"b", WIRELESS_PROTOCOL_B},
    {"a", WIRELESS_PROTOCOL_A},
    {"an", WIRELESS_PROTOCOL_AN},
    {"bg", WIRELESS_PROTOCOL_BG},
    {"bgn", WIRELESS_PROTOCOL_BGN},
    {"a/n", WIRELESS_PROTOCOL_AN},
    {"b/g", WIRELESS_PROTOCOL_BG},
    {"b/n", WIRELESS_PROTOCOL_BN},
    {"b/g/n", WIRELESS_PROTOCOL_BGN},
    {"11b/n", WIRELESS_PROTOCOL_BN},
    {"bn", WIRELESS_PROTOCOL_BN},
};

const char* TAVIWirelessProtocolStringGet(int protocol) {
    constexpr const char* kNames[] = {"unknown", "11b/g",     "11b",  "11a",   "11a/b/g",
                                      "11g",     "11a/b/g/n", "11n",  "11g/n", "11a/n",
                                      "11b/g/n", "11a/g/n",   "11b/n"};
    return taviwireless::wireless::NameOf(kNames, protocol, WIRELESS_PROTOCOL_UNKNOWN);
}
