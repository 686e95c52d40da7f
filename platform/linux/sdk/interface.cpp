// SPDX-License-Identifier: MIT
// What is known of a network interface.
#include <arpa/inet.h>
#include <net/if.h>
#include <tavisdk/network.h>

#include "core/failure.h"
#include "core/line.h"
#include "sdk/netlink.h"

using namespace tavicore;
using namespace tavisdk;

int TAVINetIFGetInfo(const char* interface, TAVINetIFInfo* info) {
    return Guarded(-1, [&] {
        RequireAll(interface, info);
        *info = TAVINetIFInfo{};
        const unsigned int index = if_nametoindex(interface);
        if (index == 0) {
            Require(errno == ENODEV ? 0 : -1);
            return 0;
        }
        const Socket socket = OpenRouteSocket();
        const std::string address = FindAddress(socket.get(), index).local;
        CopyOut(address, info->address, sizeof info->address);
        return address.empty() ? 0 : 1;
    });
}

int BlVEXAIsIpAddr(const char* text) {
    in6_addr address;
    return text != nullptr &&
           (inet_pton(AF_INET, text, &address) == 1 || inet_pton(AF_INET6, text, &address) == 1);
}
