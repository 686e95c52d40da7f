// SPDX-License-Identifier: MIT
// Interfaces: up, down, and the state of their links.
#include <net/if.h>
#include <tavisdk/network.h>

#include "core/failure.h"
#include "core/line.h"
#include "sdk/netlink.h"

using namespace tavicore;
using namespace tavisdk;

namespace {

constexpr unsigned int kCarrier = 1 << 16;  // IFF_LOWER_UP, which <net/if.h> lacks

unsigned int FlagsOf(const char* interface) {
    RequireAll(interface);
    const int index = FindInterface(interface);
    const Socket socket = OpenRouteSocket();
    rtnl_link* link = nullptr;
    Require(rtnl_link_get_kernel(socket.get(), index, nullptr, &link));
    return rtnl_link_get_flags(Link(link).get());
}

Link NewLink() {
    Link link(rtnl_link_alloc());
    if (!link) {
        throw Failure{VEXAC_ERR_OUT_OF_MEMORY};
    }
    return link;
}

int Switch(const char* interface, bool up) {
    return Guarded(0, [&] {
        RequireAll(interface);
        const Link which = NewLink();
        const Link changes = NewLink();
        rtnl_link_set_ifindex(which.get(), FindInterface(interface));
        (up ? rtnl_link_set_flags : rtnl_link_unset_flags)(changes.get(), IFF_UP);
        const Socket socket = OpenRouteSocket();
        Require(rtnl_link_change(socket.get(), which.get(), changes.get(), 0));
        return 1;
    });
}

int LinkState(unsigned int flags) {
    if ((flags & IFF_UP) == 0) {
        return VEXA_NET_LINK_DOWN;
    }
    return (flags & kCarrier) != 0 ? VEXA_NET_LINK_CONNECTED : VEXA_NET_LINK_NO_CARRIER;
}

}  // namespace

int TAVINetIsIFUp(const char* interface) {
    return Guarded(0, [&] { return (FlagsOf(interface) & IFF_UP) != 0 ? 1 : 0; });
}

int VEXANetIfUp(const char* interface) {
    return Switch(interface, true);
}

int VEXANetIfDown(const char* interface) {
    return Switch(interface, false);
}

int VEXANetGetInterfaceInfo(VEXANetInterfaceInfo* interfaces, int max, int kind) {
    return Guarded(-1, [&] {
        RequireAll(interfaces);
        if (kind != VEXA_NET_ALL_INTERFACES || max < 0) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        const Socket socket = OpenRouteSocket();
        nl_cache* all = nullptr;
        Require(rtnl_link_alloc_cache(socket.get(), AF_UNSPEC, &all));
        const Cache cache(all);
        int count = 0;
        for (nl_object* object = nl_cache_get_first(all); object != nullptr && count < max;
             object = nl_cache_get_next(object)) {
            auto* link = reinterpret_cast<rtnl_link*>(object);
            const unsigned int flags = rtnl_link_get_flags(link);
            if ((flags & IFF_LOOPBACK) == 0) {
                VEXANetInterfaceInfo& info = interfaces[count++];
                CopyOut(rtnl_link_get_name(link), info.name, sizeof info.name);
                info.linkState = LinkState(flags);
            }
        }
        return count;
    });
}
