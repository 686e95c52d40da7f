// SPDX-License-Identifier: MIT
// What a connection comes to: address, route, name servers.
#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include <cstring>
#include <fstream>
#include <memory>
#include <sstream>

#include "base/join.h"
#include "cli/adapter/requirements.h"
#include "cli/doctor/check.h"
#include "cli/wifi/station.h"
#include "wireless/rules/paths.h"

namespace taviwireless::cli {

namespace {

// "192.168.9.20 (wlan0)" of every interface but the loopback one.
std::string Addresses() {
    ifaddrs* all = nullptr;
    if (getifaddrs(&all) != 0) {
        return "";
    }
    const std::unique_ptr<ifaddrs, decltype(&freeifaddrs)> list(all, freeifaddrs);
    std::string addresses;
    for (const ifaddrs* entry = all; entry != nullptr; entry = entry->ifa_next) {
        char text[INET_ADDRSTRLEN];
        const bool counts = entry->ifa_addr != nullptr && entry->ifa_addr->sa_family == AF_INET &&
                            (entry->ifa_flags & IFF_UP) != 0 &&
                            (entry->ifa_flags & IFF_LOOPBACK) == 0;
        if (counts) {
            sockaddr_in address{};
            memcpy(&address, entry->ifa_addr, sizeof address);
            inet_ntop(AF_INET, &address.sin_addr, text, sizeof text);
            AddItem(addresses, std::string(text) + " (" + entry->ifa_name + ")");
        }
    }
    return addresses;
}

Findings Wifi() {
    const int status = TAVIWirelessConnStatusGet();
    if (status == WIRELESS_STATUS_NO_ADAPTER || status == WIRELESS_STATUS_NOT_SUPPORTED) {
        return {};
    }
    return IsInNetwork(status) ? Ok(WifiInterface() + " is connected")
                               : Unknown(WifiInterface() + " is not connected",
                                         "taviwireless wifi connect NETWORK, or wifi auto");
}

Findings Address() {
    const std::string addresses = Addresses();
    return addresses.empty()
               ? Failed("no interface has one", "connect; or look whether a DHCP server answers")
               : Ok(addresses);
}

Findings Route() {
    if (Addresses().empty()) {
        return Unknown("comes after an address");
    }
    char gateway[TAVI_NET_ADDRESS_SIZE];
    return TAVINetDefaultGatewayGet(gateway, sizeof gateway) == 0
               ? Ok(std::string("by ") + gateway)
               : Failed("there is no default route",
                        "connect again, or set the gateway: wifi connect --static, modem profile "
                        "set default_gw=true");
}

Findings NameServers() {
    std::string servers;
    std::ifstream file(wireless::kResolver);
    for (std::string line; std::getline(file, line);) {
        std::istringstream words(line);
        std::string key, server;
        words >> key >> server;
        if (key == "nameserver" && !server.empty()) {
            AddItem(servers, server);
        }
    }
    return servers.empty() ? Failed(std::string(wireless::kResolver) + " names none",
                                    "connect again, or write a line: nameserver ADDRESS")
                           : Ok(servers);
}

}  // namespace

Checks NetworkChecks() {
    return {{"Wi-Fi connection", Wifi},
            {"address", Address},
            {"route", Route},
            {"name servers", NameServers}};
}

}  // namespace taviwireless::cli
