// SPDX-License-Identifier: MIT
#include "platform/host_root/network/kernel_objects.h"

#include <linux/if_addr.h>
#include <linux/rtnetlink.h>
#include <net/if.h>

#include "platform/host_root/network/error.h"

namespace taviwireless::network {

namespace {

std::string Text(nl_addr* address) {
    char text[64];
    return nl_addr2str(address, text, sizeof text);
}

// A copy of the cache's object.
template <typename Object>
std::shared_ptr<Object> Copy(Object* object, void (*release)(Object*)) {
    auto* copy = reinterpret_cast<Object*>(nl_object_clone(OBJ_CAST(object)));
    if (copy == nullptr) {
        throw std::bad_alloc();
    }
    return {copy, release};
}

std::shared_ptr<nl_addr> Parse(const std::string& text) {
    nl_addr* address = nullptr;
    if (nl_addr_parse(text.c_str(), AF_UNSPEC, &address) < 0) {
        throw Error("\"" + text + "\" is not an address");
    }
    return {address, nl_addr_put};
}

std::string GatewayOf(rtnl_route* route) {
    nl_addr* gateway = rtnl_route_get_nnexthops(route) == 1
                           ? rtnl_route_nh_get_gateway(rtnl_route_nexthop_n(route, 0))
                           : nullptr;
    return gateway == nullptr ? "" : Text(gateway);
}

bool IsDefault(rtnl_route* route) {
    nl_addr* destination = rtnl_route_get_dst(route);
    return destination == nullptr || nl_addr_get_prefixlen(destination) == 0;
}

// Takes the end of its lifetime from an address: the tool that would renew it asks at the interface
// that had it, and gets no answers there.
void MakePermanent(rtnl_addr* address) {
    constexpr uint32_t kForEver = UINT32_MAX;
    rtnl_addr_set_preferred_lifetime(address, kForEver);
    rtnl_addr_set_valid_lifetime(address, kForEver);
}

}  // namespace

void Require(int result, const std::string& doing) {
    if (result < 0) {
        throw Error("cannot " + doing + ": " + nl_geterror(result));
    }
}

void ForEach(nl_cache* cache, const std::function<void(nl_object*)>& visit) {
    for (nl_object* object = nl_cache_get_first(cache); object != nullptr;
         object = nl_cache_get_next(object)) {
        visit(object);
    }
}

bool WasGiven(rtnl_addr* address) {
    const bool isIPv4 = rtnl_addr_get_family(address) == AF_INET;
    const bool isLasting = (rtnl_addr_get_flags(address) & IFA_F_PERMANENT) != 0;
    return rtnl_addr_get_local(address) != nullptr &&
           rtnl_addr_get_scope(address) != RT_SCOPE_HOST &&
           (isIPv4 || (isLasting && rtnl_addr_get_scope(address) == RT_SCOPE_UNIVERSE));
}

bool WasGiven(rtnl_route* route) {
    const int protocol = rtnl_route_get_protocol(route);
    return rtnl_route_get_table(route) != RT_TABLE_LOCAL &&
           rtnl_route_get_type(route) == RTN_UNICAST && protocol != RTPROT_KERNEL &&
           protocol != RTPROT_RA;
}

Address Describe(rtnl_addr* address) {
    return {Text(rtnl_addr_get_local(address)), Copy(address, rtnl_addr_put)};
}

Route Describe(rtnl_route* route, const std::string& device) {
    Route described{"", GatewayOf(route), device, IsDefault(route), Copy(route, rtnl_route_put)};
    described.text = described.isDefault ? "default" : Text(rtnl_route_get_dst(route));
    if (!described.gateway.empty()) {
        described.text += " via " + described.gateway;
    }
    if (rtnl_route_get_priority(route) != 0) {
        described.text += " metric " + std::to_string(rtnl_route_get_priority(route));
    }
    if (rtnl_route_get_table(route) != RT_TABLE_MAIN) {
        described.text += " table " + std::to_string(rtnl_route_get_table(route));
    }
    return described;
}

Address NewAddress(const std::string& text) {
    const auto local = Parse(text);
    const std::shared_ptr<rtnl_addr> address(rtnl_addr_alloc(), rtnl_addr_put);
    Require(rtnl_addr_set_local(address.get(), local.get()), "hold an address");
    constexpr unsigned int kLongestWithBroadcast = 30;  // smaller networks have none to spare
    const unsigned int length = nl_addr_get_prefixlen(local.get());
    if (nl_addr_get_family(local.get()) == AF_INET && length <= kLongestWithBroadcast) {
        in_addr all = *static_cast<in_addr*>(nl_addr_get_binary_addr(local.get()));
        all.s_addr |= htonl(UINT32_MAX >> length);
        const tavisdk::Address broadcast(nl_addr_build(AF_INET, &all, sizeof all));
        Require(rtnl_addr_set_broadcast(address.get(), broadcast.get()), "hold an address");
    }
    return {Text(local.get()), address};
}

Route NewDefaultRoute(const std::string& gateway, unsigned int metric, const std::string& device) {
    const auto route = std::shared_ptr<rtnl_route>(rtnl_route_alloc(), rtnl_route_put);
    rtnl_route_set_family(route.get(), AF_INET);
    Require(rtnl_route_set_dst(route.get(), Parse("0.0.0.0/0").get()), "hold a route");
    rtnl_route_set_table(route.get(), RT_TABLE_MAIN);
    rtnl_route_set_scope(route.get(), RT_SCOPE_UNIVERSE);
    rtnl_route_set_type(route.get(), RTN_UNICAST);
    rtnl_route_set_priority(route.get(), metric);
    rtnl_route_set_protocol(route.get(), RTPROT_BOOT);
    rtnl_nexthop* hop = rtnl_route_nh_alloc();
    rtnl_route_nh_set_gateway(hop, Parse(gateway).get());
    rtnl_route_add_nexthop(route.get(), hop);  // it owns the hop now
    return Describe(route.get(), device);
}

bool IsIn(const Address& network, const std::string& address) {
    const auto tested = Parse(address);
    nl_addr* local = rtnl_addr_get_local(network.kernel.get());
    if (nl_addr_get_family(tested.get()) != nl_addr_get_family(local)) {
        return false;
    }
    nl_addr_set_prefixlen(tested.get(), static_cast<int>(nl_addr_get_prefixlen(local)));
    return nl_addr_cmp_prefix(local, tested.get()) == 0;
}

void Add(nl_sock* socket, const Address& address, const std::string& interface) {
    const auto added = Copy(address.kernel.get(), rtnl_addr_put);
    const int index = tavisdk::FindInterface(interface.c_str());
    // The route to its network comes and goes with it, also where a tool had written that itself.
    rtnl_addr_unset_flags(added.get(), IFA_F_NOPREFIXROUTE);
    if (rtnl_addr_get_ifindex(added.get()) != index) {
        rtnl_addr_set_ifindex(added.get(), index);
        MakePermanent(added.get());
        if (rtnl_addr_get_family(added.get()) == AF_INET) {
            rtnl_addr_set_label(added.get(), interface.c_str());
        }
    }
    const int result = rtnl_addr_add(socket, added.get(), NLM_F_CREATE);
    Require(result == -NLE_EXIST ? 0 : result, "give " + interface + " " + address.text);
}

void Add(nl_sock* socket, const Route& route) {
    const auto added = Copy(route.kernel.get(), rtnl_route_put);
    // States of the link that it had, which a request may not hold.
    rtnl_route_unset_flags(added.get(), RTNH_F_DEAD | RTNH_F_LINKDOWN);
    rtnl_route_nh_set_ifindex(rtnl_route_nexthop_n(added.get(), 0),
                              tavisdk::FindInterface(route.device.c_str()));
    const int result = rtnl_route_add(socket, added.get(), NLM_F_CREATE | NLM_F_EXCL);
    Require(result == -NLE_EXIST ? 0 : result,
            "set the route " + route.text + " on " + route.device);
}

}  // namespace taviwireless::network
