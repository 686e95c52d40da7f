// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_DHCP_H
#define TAVIWIRELESS_WIRELESS_RULES_DHCP_H

#include <arpa/inet.h>
#include <taviwireless/wireless.h>

#include <optional>
#include <string>
#include <string_view>

namespace taviwireless::wireless {

constexpr char kByDHCP[] = "DHCP";  // instead of the address of a saved network

inline bool IsDHCP(const WirelessConf& conf) {
    return std::string_view(conf.ipAddr) == kByDHCP;
}

struct DhcpRange {
    std::string start;
    std::string end;
};

// The addresses from the one behind the server's own up to the one before the broadcast address;
// in a subnet too small for that they may lie outside of it. Nothing when a text is no address.
inline std::optional<DhcpRange> DhcpRangeBehind(const char* address, const char* netmask) {
    in_addr own{};
    in_addr mask{};
    if (inet_aton(address, &own) == 0 || inet_aton(netmask, &mask) == 0) {
        return std::nullopt;
    }
    const auto asText = [](uint32_t number) {
        const in_addr inNetworkOrder{htonl(number)};
        char text[INET_ADDRSTRLEN];
        return std::string(inet_ntop(AF_INET, &inNetworkOrder, text, sizeof text));
    };
    const uint32_t broadcast = ntohl(own.s_addr) | ~ntohl(mask.s_addr);
    return DhcpRange{asText(ntohl(own.s_addr) + 1), asText(broadcast - 1)};
}

}  // namespace taviwireless::wireless

#endif
