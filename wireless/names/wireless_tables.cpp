// The names that are understood. Where one value has several, they are those of drivers, tools and
// configuration files.
#include <taviwireless/wireless.h>

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

const WirelessNameValue gWirelessEncrypts[WIRELESS_ENCRYPT_NAMES] = {
    {"UNKNOW", WIRELESS_ENCRYPT_UNKNOWN},    {"NONE", WIRELESS_ENCRYPT_NONE},
    {"WEP", WIRELESS_ENCRYPT_WEP},           {"TKIP", WIRELESS_ENCRYPT_TKIP},
    {"AES", WIRELESS_ENCRYPT_AES},           {"TKIPAES", WIRELESS_ENCRYPT_TKIP_AES},
    {"TKIP AES", WIRELESS_ENCRYPT_TKIP_AES},
};

const WirelessNameValue gWirelessOpmodes[WIRELESS_OPMODE_NAMES] = {
    {"Auto", WIRELESS_OPMODE_AUTO},         {"Ad-Hoc", WIRELESS_OPMODE_ADHOC},
    {"Managed", WIRELESS_OPMODE_MANAGED},   {"Master", WIRELESS_OPMODE_MASTER},
    {"Repeater", WIRELESS_OPMODE_REPEATER}, {"Secondary", WIRELESS_OPMODE_SECONDARY},
    {"Monitor", WIRELESS_OPMODE_MONITOR},   {"Unknown/bug", WIRELESS_OPMODE_UNKNOWN},
    {"In", WIRELESS_OPMODE_MANAGED},        {"Ad", WIRELESS_OPMODE_ADHOC},
    {"Infra", WIRELESS_OPMODE_MANAGED},     {"Adhoc", WIRELESS_OPMODE_ADHOC},
    {"Any", WIRELESS_OPMODE_MANAGED},
};

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
