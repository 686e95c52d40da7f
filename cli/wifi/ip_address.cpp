#include "cli/wifi/ip_address.h"

#include <arpa/inet.h>

#include <optional>

#include "base/fixed_field.h"
#include "cli/command_error.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

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
