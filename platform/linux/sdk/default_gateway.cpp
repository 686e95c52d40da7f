// SPDX-License-Identifier: MIT
// The default gateway: in force, and in the saved settings.
#include <linux/rtnetlink.h>
#include <tavisdk/network.h>

#include "core/failure.h"
#include "core/line.h"
#include "sdk/netlink.h"
#include "sdk/settings_files.h"

using namespace tavicore;
using namespace tavisdk;

namespace {

constexpr char kNetworkFile[] = "/etc/sysconfig/network";
constexpr char kInterfaceFiles[] = "/etc/sysconfig/network-scripts";
constexpr char kGatewayKey[] = "GATEWAY";

// A route with a type of service carries the packets marked so, and is the default of no others.
bool IsDefault(rtnl_route* route) {
    nl_addr* destination = rtnl_route_get_dst(route);
    return rtnl_route_get_table(route) == RT_TABLE_MAIN &&
           rtnl_route_get_type(route) == RTN_UNICAST && rtnl_route_get_tos(route) == 0 &&
           (destination == nullptr || nl_addr_get_prefixlen(destination) == 0);
}

// The default route with the lowest metric; null when there is none.
Route FindDefaultRoute(nl_sock* socket) {
    nl_cache* routes = nullptr;
    Require(rtnl_route_alloc_cache(socket, AF_INET, 0, &routes));
    const Cache cache(routes);
    rtnl_route* best = nullptr;
    for (nl_object* object = nl_cache_get_first(routes); object != nullptr;
         object = nl_cache_get_next(object)) {
        auto* route = reinterpret_cast<rtnl_route*>(object);
        if (IsDefault(route) &&
            (best == nullptr || rtnl_route_get_priority(route) < rtnl_route_get_priority(best))) {
            best = route;
        }
    }
    if (best != nullptr) {
        nl_object_get(OBJ_CAST(best));  // it outlives the cache
    }
    return Route(best);
}

// Empty when the route has no gateway.
std::string GatewayOf(nl_sock* socket, rtnl_route* route) {
    if (rtnl_route_get_nnexthops(route) < 1) {
        return "";
    }
    rtnl_nexthop* hop = rtnl_route_nexthop_n(route, 0);
    const std::string gateway = ToText(rtnl_route_nh_get_gateway(hop));
    return !gateway.empty()
               ? gateway
               : FindAddress(socket, static_cast<unsigned int>(rtnl_route_nh_get_ifindex(hop)))
                     .peer;
}

// 0.0.0.0/0, the destination of default routes.
Address Everywhere() {
    Address everywhere = ParseAddress("0.0.0.0");
    nl_addr_set_prefixlen(everywhere.get(), 0);
    return everywhere;
}

bool ReadGatewayOfInterfaces(char* gateway, size_t size) {
    const StringList names = ListFiles(kInterfaceFiles, "ifcfg-");
    for (int i = 0; i < names->count; ++i) {
        const std::string file =
            std::string(kInterfaceFiles) + '/' + VEXACSzListGet(names.get(), i);
        if (!HasSetting(file, "ONBOOT", "no") && ReadSetting(file, kGatewayKey, gateway, size)) {
            return true;
        }
    }
    return false;
}

}  // namespace

int TAVINetDefaultGatewayGet(char* gateway, size_t size) {
    return Guarded(-1, [&] {
        RequireAll(gateway);
        const Socket socket = OpenRouteSocket();
        const Route route = FindDefaultRoute(socket.get());
        const std::string found = route ? GatewayOf(socket.get(), route.get()) : "";
        if (found.empty()) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        CopyOut(found, gateway, size);
        return 0;
    });
}

int TAVINetDefaultGatewaySet(const char* gateway) {
    return Guarded(-1, [&] {
        RequireAll(gateway);
        const Address address = ParseAddress(gateway);
        const Address everywhere = Everywhere();
        const Socket socket = OpenRouteSocket();
        const Route old = FindDefaultRoute(socket.get());
        const Route route(rtnl_route_alloc());
        NextHop hop(rtnl_route_nh_alloc());
        if (!route || !hop) {
            throw Failure{VEXAC_ERR_OUT_OF_MEMORY};
        }
        rtnl_route_set_family(route.get(), AF_INET);
        Require(rtnl_route_set_dst(route.get(), everywhere.get()));
        // With the old route's metric it takes that route's place instead of standing beside it.
        rtnl_route_set_priority(route.get(), old ? rtnl_route_get_priority(old.get()) : 0);
        // The protocol is that of the routes that pppd sets, so that the kernel refuses pppd a
        // second route like this one; with another protocol both would stand side by side.
        rtnl_route_set_protocol(route.get(), RTPROT_BOOT);
        rtnl_route_nh_set_gateway(hop.get(), address.get());
        rtnl_route_add_nexthop(route.get(), hop.release());  // it owns the hop now
        Require(rtnl_route_add(socket.get(), route.get(), NLM_F_CREATE | NLM_F_REPLACE));
        return 0;
    });
}

int TAVINetDefaultGatewayGetConf(char* gateway, size_t size) {
    return Guarded(-1, [&] {
        RequireAll(gateway);
        if (!ReadSetting(kNetworkFile, kGatewayKey, gateway, size) &&
            !ReadGatewayOfInterfaces(gateway, size)) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        return 0;
    });
}
