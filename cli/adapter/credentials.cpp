#include "cli/adapter/credentials.h"

#include <arpa/inet.h>

#include <algorithm>
#include <optional>

#include "cli/command_line.h"
#include "cli/prompt.h"
#include "cli/report.h"
#include "cli/wifi/station.h"
#include "wireless/rules/line_break.h"

namespace taviwireless::cli {

namespace {

constexpr char kDHCP[] = "DHCP";

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

bool IsHexDigit(char c) {
    return (c >= '0' && c <= '9') || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

bool IsWEPKey(const std::string& key) {
    const size_t size = key.size();
    return size == 5 || size == 13 ||
           ((size == 10 || size == 26) && std::all_of(key.begin(), key.end(), IsHexDigit));
}

// A password may be UTF-8 text.
bool IsAllowed(Security security, unsigned char c) {
    return c >= ' ' && c != 0x7F && (c < 0x80 || security == Security::kEAP);
}

bool HasForm(Security security, const std::string& key) {
    switch (security) {
        case Security::kWEP:
            return IsWEPKey(key);
        case Security::kWPA:
            return key.size() >= 8 && key.size() <= 63;
        default:
            return !key.empty() && key.size() < WIRELESS_KEY_SIZE;
    }
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

std::optional<in_addr> ParseAddress(const std::string& text) {
    in_addr address{};
    if (inet_pton(AF_INET, text.c_str(), &address) != 1) {
        return std::nullopt;
    }
    return address;
}

// 1 to 32 leading bits.
std::optional<in_addr> ParsePrefix(const std::string& text) {
    const bool isNumber = !text.empty() && text.size() <= 2 &&
                          text.find_first_not_of("0123456789") == std::string::npos;
    const int bits = isNumber ? std::stoi(text) : 0;
    if (bits < 1 || bits > 32) {
        return std::nullopt;
    }
    return in_addr{htonl(~uint32_t{0} << (32 - bits))};
}

std::string ToText(in_addr address) {
    char text[INET_ADDRSTRLEN];
    return inet_ntop(AF_INET, &address, text, sizeof text);
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

void CheckKey(Security security, const std::string& key) {
    const bool isText =
        std::all_of(key.begin(), key.end(), [security](char c) { return IsAllowed(security, c); });
    if (!isText || !HasForm(security, key)) {
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

void SetStaticAddress(WirelessConf& conf, const std::string& text) {
    const size_t slash = text.find('/');
    const size_t comma = text.find(',');
    const auto address = ParseAddress(text.substr(0, slash));
    const auto mask = slash == std::string::npos
                          ? std::nullopt
                          : ParsePrefix(text.substr(slash + 1, comma - slash - 1));
    const bool hasGateway = comma != std::string::npos;
    const auto gateway = hasGateway ? ParseAddress(text.substr(comma + 1)) : std::nullopt;
    if (!address || !mask || (hasGateway && !gateway)) {
        throw CommandError(kUsage, Printable(text) +
                                       " is no address such as 192.168.1.20/24 or, with a "
                                       "gateway, 192.168.1.20/24,192.168.1.1");
    }
    if (gateway && ((gateway->s_addr ^ address->s_addr) & mask->s_addr) != 0) {
        throw CommandError(kUsage, "the gateway " + ToText(*gateway) +
                                       " is not in the network of " + ToText(*address));
    }
    SetField(conf.ipAddr, ToText(*address));
    SetField(conf.netmask, ToText(*mask));
    SetField(conf.gateway, gateway ? ToText(*gateway) : "");
}

void SetDHCP(WirelessConf& conf) {
    SetField(conf.ipAddr, kDHCP);
    SetField(conf.netmask, "");
    SetField(conf.gateway, "");
}

bool IsDHCP(const WirelessConf& conf) {
    return std::string(conf.ipAddr) == kDHCP;
}

}  // namespace taviwireless::cli
