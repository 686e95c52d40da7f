// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_SDK_NETLINK_H
#define TAVIWIRELESS_PLATFORM_LINUX_SDK_NETLINK_H

#include <netlink/cache.h>
#include <netlink/netlink.h>
#include <netlink/route/addr.h>
#include <netlink/route/link.h>
#include <netlink/route/route.h>

#include <memory>
#include <string>

// libnl's objects as owners, and the questions that the network calls share. Everything here throws
// tavicore::Failure.
namespace tavisdk {

struct Release {
    void operator()(nl_sock* socket) const { nl_socket_free(socket); }
    void operator()(nl_cache* cache) const { nl_cache_free(cache); }
    void operator()(nl_addr* address) const { nl_addr_put(address); }
    void operator()(rtnl_link* link) const { rtnl_link_put(link); }
    void operator()(rtnl_addr* address) const { rtnl_addr_put(address); }
    void operator()(rtnl_route* route) const { rtnl_route_put(route); }
    void operator()(rtnl_nexthop* hop) const { rtnl_route_nh_free(hop); }
};

using Socket = std::unique_ptr<nl_sock, Release>;
using Cache = std::unique_ptr<nl_cache, Release>;
using Address = std::unique_ptr<nl_addr, Release>;
using Link = std::unique_ptr<rtnl_link, Release>;
using OwnAddress = std::unique_ptr<rtnl_addr, Release>;  // one that an interface has
using Route = std::unique_ptr<rtnl_route, Release>;
using NextHop = std::unique_ptr<rtnl_nexthop, Release>;

// Throws when the result of a libnl call is a failure.
void Require(int result);

Socket OpenRouteSocket();

// The number of an interface; throws VEXAC_ERR_NOT_FOUND when there is none of this name.
int FindInterface(const char* name);

// An IPv4 address; throws VEXAC_ERR_BAD_PARAMETER when the text is none.
Address ParseAddress(const char* text);

// The IPv4 addresses of an interface, both ends of a point-to-point link; empty where there is
// none.
struct InterfaceAddress {
    std::string local;
    std::string peer;
};
InterfaceAddress FindAddress(nl_sock* socket, unsigned int interfaceIndex);

std::string ToText(nl_addr* address);

}  // namespace tavisdk

#endif
