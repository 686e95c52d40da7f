// SPDX-License-Identifier: MIT
// The IPv4 settings of an interface.
#include <arpa/inet.h>
#include <tavisdk/network.h>

#include <vector>

#include "core/failure.h"
#include "sdk/dhcp_client.h"
#include "sdk/netlink.h"

using namespace tavicore;
using namespace tavisdk;

namespace {

// The number of ones that a netmask begins with; throws when it has others behind a zero.
int PrefixLength(const char* netmask) {
    in_addr mask;
    if (inet_pton(AF_INET, netmask, &mask) != 1) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
    const uint32_t bits = ntohl(mask.s_addr);
    if ((~bits & (~bits + 1)) != 0) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
    return __builtin_popcount(bits);
}

OwnAddress MakeOwnAddress(int index, const TAVINetCard& card) {
    const Address local = ParseAddress(card.address);
    const int prefixLength = PrefixLength(card.netmask);
    nl_addr_set_prefixlen(local.get(), prefixLength);
    OwnAddress address(rtnl_addr_alloc());
    if (!address) {
        throw Failure{VEXAC_ERR_OUT_OF_MEMORY};
    }
    rtnl_addr_set_ifindex(address.get(), index);
    Require(rtnl_addr_set_local(address.get(), local.get()));
    in_addr broadcast = *static_cast<in_addr*>(nl_addr_get_binary_addr(local.get()));
    constexpr int kLongestWithBroadcast = 30;  // smaller networks have no address to spare
    if (prefixLength <= kLongestWithBroadcast) {
        broadcast.s_addr |= htonl(UINT32_MAX >> prefixLength);
        const Address all(nl_addr_build(AF_INET, &broadcast, sizeof broadcast));
        Require(all ? rtnl_addr_set_broadcast(address.get(), all.get()) : -1);
    }
    return address;
}

std::vector<OwnAddress> AddressesOf(nl_sock* socket, int index) {
    nl_cache* all = nullptr;
    Require(rtnl_addr_alloc_cache(socket, &all));
    const Cache cache(all);
    std::vector<OwnAddress> found;
    for (nl_object* object = nl_cache_get_first(all); object != nullptr;
         object = nl_cache_get_next(object)) {
        auto* address = reinterpret_cast<rtnl_addr*>(object);
        if (rtnl_addr_get_ifindex(address) == index && rtnl_addr_get_family(address) == AF_INET) {
            nl_object_get(object);  // it outlives the cache
            found.emplace_back(address);
        }
    }
    return found;
}

bool IsSame(rtnl_addr* a, rtnl_addr* b) {
    return rtnl_addr_get_prefixlen(a) == rtnl_addr_get_prefixlen(b) &&
           nl_addr_cmp(rtnl_addr_get_local(a), rtnl_addr_get_local(b)) == 0;
}

void RemoveOthers(nl_sock* socket, int index, rtnl_addr* wanted) {
    for (const OwnAddress& address : AddressesOf(socket, index)) {
        if (!IsSame(address.get(), wanted)) {
            const int result = rtnl_addr_delete(socket, address.get(), 0);
            // With the first address of a network, the kernel removes the further ones.
            Require(result == -NLE_NOADDR ? 0 : result);
        }
    }
}

}  // namespace

int TAVINetSetCard1(const TAVINetCard* card, int flags) {
    return Guarded(-1, [&] {
        RequireAll(card);
        if (flags != 0) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        const int index = FindInterface(card->interface);
        if (card->isStatic == 0 && card->address[0] == '\0') {
            throw Failure{VEXAC_ERR_NOT_FOUND};  // no lease
        }
        const OwnAddress wanted = MakeOwnAddress(index, *card);
        if (card->isStatic != 0) {
            StopDhcpClient(card->interface);  // or it would set its own address again
        }
        const Socket socket = OpenRouteSocket();
        RemoveOthers(socket.get(), index, wanted.get());
        Require(rtnl_addr_add(socket.get(), wanted.get(), NLM_F_CREATE | NLM_F_REPLACE));
        return 0;
    });
}
