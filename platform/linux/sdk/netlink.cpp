// SPDX-License-Identifier: MIT
#include "sdk/netlink.h"

#include <arpa/inet.h>
#include <net/if.h>

#include "core/failure.h"

namespace tavisdk {

void Require(int result) {
    if (result < 0) {
        throw tavicore::Failure{VEXAC_ERR_IO};
    }
}

Socket OpenRouteSocket() {
    Socket socket(nl_socket_alloc());
    if (!socket) {
        throw tavicore::Failure{VEXAC_ERR_OUT_OF_MEMORY};
    }
    Require(nl_connect(socket.get(), NETLINK_ROUTE));
    return socket;
}

int FindInterface(const char* name) {
    const unsigned int index = if_nametoindex(name);
    if (index == 0) {
        throw tavicore::Failure{errno == ENODEV ? VEXAC_ERR_NOT_FOUND : VEXAC_ERR_IO};
    }
    return static_cast<int>(index);
}

Address ParseAddress(const char* text) {
    in_addr address;
    if (inet_pton(AF_INET, text, &address) != 1) {
        throw tavicore::Failure{VEXAC_ERR_BAD_PARAMETER};
    }
    Address built(nl_addr_build(AF_INET, &address, sizeof address));
    if (!built) {
        throw tavicore::Failure{VEXAC_ERR_OUT_OF_MEMORY};
    }
    return built;
}

std::string ToText(nl_addr* address) {
    char text[INET_ADDRSTRLEN] = {};
    if (address != nullptr && nl_addr_get_family(address) == AF_INET) {
        inet_ntop(AF_INET, nl_addr_get_binary_addr(address), text, sizeof text);
    }
    return text;
}

InterfaceAddress FindAddress(nl_sock* socket, unsigned int interfaceIndex) {
    nl_cache* addresses = nullptr;
    Require(rtnl_addr_alloc_cache(socket, &addresses));
    const Cache cache(addresses);
    for (nl_object* object = nl_cache_get_first(addresses); object != nullptr;
         object = nl_cache_get_next(object)) {
        auto* address = reinterpret_cast<rtnl_addr*>(object);
        if (rtnl_addr_get_ifindex(address) == static_cast<int>(interfaceIndex) &&
            rtnl_addr_get_family(address) == AF_INET) {
            return {ToText(rtnl_addr_get_local(address)), ToText(rtnl_addr_get_peer(address))};
        }
    }
    return {};
}

}  // namespace tavisdk
