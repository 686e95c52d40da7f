#include "cli/adapter/credentials.h"

#include <arpa/inet.h>

#include <optional>

#include "base/fixed_field.h"
#include "cli/command_line.h"
#include "cli/prompt.h"
#include "cli/report.h"
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
    CopyField(conf.ipAddr, ToText(*address));
    CopyField(conf.netmask, ToText(*mask));
    CopyField(conf.gateway, gateway ? ToText(*gateway) : "");
}

void SetDHCP(WirelessConf& conf) {
    CopyField(conf.ipAddr, wireless::kByDHCP);
    CopyField(conf.netmask, "");
    CopyField(conf.gateway, "");
}

}  // namespace taviwireless::cli
