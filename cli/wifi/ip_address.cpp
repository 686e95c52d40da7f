// SPDX-License-Identifier: MIT
#include "cli/wifi/ip_address.h"

#include <arpa/inet.h>

#include <optional>

#include "base/fixed_field.h"
#include "base/split.h"
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
    const size_t comma = text.find(',');
    SetOwnAddress(conf, text.substr(0, comma));
    SetGateway(conf, comma == std::string::npos ? "" : text.substr(comma + 1));
    CheckAddress(conf, "");
}

void SetOwnAddress(WirelessConf& conf, const std::string& text) {
    const size_t slash = text.find('/');
    const auto address = ParseAddress(text.substr(0, slash));
    const auto mask =
        slash == std::string::npos ? std::nullopt : ParsePrefix(text.substr(slash + 1));
    if (!address || !mask) {
        throw CommandError(kUsage,
                           Printable(text) + " is no address with a prefix, as 192.168.1.20/24 is");
    }
    CopyField(conf.ipAddr, ToText(*address));
    CopyField(conf.netmask, ToText(*mask));
}

void SetGateway(WirelessConf& conf, const std::string& text) {
    const auto gateway = ParseAddress(text);
    if (!gateway && !text.empty()) {
        throw CommandError(kUsage, "the gateway " + Printable(text) + " is no address");
    }
    CopyField(conf.gateway, gateway ? ToText(*gateway) : "");
}

void CheckNameServers(const std::string& text) {
    constexpr size_t kMost = 3;  // more are not asked
    const std::vector<std::string> servers = Split(text, ',');
    for (const std::string& server : servers) {
        if (!ParseAddress(server)) {
            throw CommandError(kUsage, "the name server " + Printable(server) + " is no address");
        }
    }
    if (servers.size() > kMost) {
        throw CommandError(kUsage, "there can be three name servers at most");
    }
}

void CheckAddress(const WirelessConf& conf, const std::string& nameServers) {
    if (IsDHCP(conf)) {
        if (conf.gateway[0] != '\0' || !nameServers.empty()) {
            throw CommandError(kUsage,
                               "gateway and name servers go with a static address; by DHCP they "
                               "come with it");
        }
        return;
    }
    const auto address = ParseAddress(conf.ipAddr);
    const auto mask = ParseAddress(conf.netmask);
    const auto gateway = ParseAddress(conf.gateway);
    if (address && mask && gateway && ((gateway->s_addr ^ address->s_addr) & mask->s_addr) != 0) {
        throw CommandError(kUsage, "the gateway " + ToText(*gateway) +
                                       " is not in the network of " + ToText(*address));
    }
}

void SetDHCP(WirelessConf& conf) {
    CopyField(conf.ipAddr, wireless::kByDHCP);
    CopyField(conf.netmask, "");
    CopyField(conf.gateway, "");
}

}  // namespace taviwireless::cli
