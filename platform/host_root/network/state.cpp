// SPDX-License-Identifier: MIT
#include "platform/host_root/network/state.h"

#include <net/if.h>
#include <netlink/route/link/bridge.h>
#include <tavisdk/network.h>
#include <unistd.h>

#include <algorithm>

#include "platform/host_root/network/error.h"

namespace taviwireless::network {

namespace {

using tavisdk::Cache;
using tavisdk::Socket;

std::string NameOf(int index) {
    char name[IF_NAMESIZE] = "";
    return index > 0 && if_indextoname(static_cast<unsigned int>(index), name) != nullptr ? name
                                                                                          : "";
}

void ReadLinks(nl_sock* socket, State& state) {
    nl_cache* all = nullptr;
    Require(rtnl_link_alloc_cache(socket, AF_UNSPEC, &all), "list the interfaces");
    const Cache cache(all);
    ForEach(all, [&](nl_object* object) {
        auto* link = reinterpret_cast<rtnl_link*>(object);
        const std::string name = rtnl_link_get_name(link);
        Interface& interface = state.interfaces[name];
        const char* type = rtnl_link_get_type(link);
        interface.isBridge = type != nullptr && std::string(type) == "bridge";
        interface.isRadio = access(("/sys/class/net/" + name + "/phy80211").c_str(), F_OK) == 0;
        interface.isUp = (rtnl_link_get_flags(link) & IFF_UP) != 0;
        interface.master = NameOf(rtnl_link_get_master(link));
        char hardware[32];
        interface.hardware = nl_addr2str(rtnl_link_get_addr(link), hardware, sizeof hardware);
    });
}

void ReadAddresses(nl_sock* socket, State& state) {
    nl_cache* all = nullptr;
    Require(rtnl_addr_alloc_cache(socket, &all), "list the addresses");
    const Cache cache(all);
    ForEach(all, [&](nl_object* object) {
        auto* address = reinterpret_cast<rtnl_addr*>(object);
        const auto owner = state.interfaces.find(NameOf(rtnl_addr_get_ifindex(address)));
        if (owner != state.interfaces.end() && WasGiven(address)) {
            owner->second.addresses.push_back(Describe(address));
        }
    });
}

void ReadRoutes(nl_sock* socket, int family, State& state) {
    nl_cache* all = nullptr;
    Require(rtnl_route_alloc_cache(socket, family, 0, &all), "list the routes");
    const Cache cache(all);
    ForEach(all, [&](nl_object* object) {
        auto* route = reinterpret_cast<rtnl_route*>(object);
        // A route with several next hops does not belong to one interface.
        if (rtnl_route_get_nnexthops(route) == 1 && WasGiven(route)) {
            const int index = rtnl_route_nh_get_ifindex(rtnl_route_nexthop_n(route, 0));
            state.routes.push_back(Describe(route, NameOf(index)));
        }
    });
}

tavisdk::Link NewLink() {
    tavisdk::Link link(rtnl_link_alloc());
    if (!link) {
        throw std::bad_alloc();
    }
    return link;
}

// Makes a bridge with the hardware address of the interface that brings the network, so that other
// machines on it see no change.
void MakeBridge(nl_sock* socket, const std::string& name, const std::string& hardware) {
    const tavisdk::Link bridge(rtnl_link_bridge_alloc());
    if (!bridge) {
        throw std::bad_alloc();
    }
    rtnl_link_set_name(bridge.get(), name.c_str());
    nl_addr* address = nullptr;
    if (!hardware.empty() && nl_addr_parse(hardware.c_str(), AF_LLC, &address) == 0) {
        rtnl_link_set_addr(bridge.get(), address);
        nl_addr_put(address);
    }
    Require(rtnl_link_add(socket, bridge.get(), NLM_F_CREATE | NLM_F_EXCL),
            "make the bridge " + name);
}

void RemoveInterface(nl_sock* socket, const std::string& name) {
    const tavisdk::Link link = NewLink();
    rtnl_link_set_ifindex(link.get(), tavisdk::FindInterface(name.c_str()));
    Require(rtnl_link_delete(socket, link.get()), "remove the bridge " + name);
}

// Puts the interface into the bridge; without a name of a bridge, takes it out of the one it is in.
void SetMaster(nl_sock* socket, const std::string& name, const std::string& bridge) {
    const int index = tavisdk::FindInterface(name.c_str());
    if (bridge.empty()) {
        Require(rtnl_link_release_ifindex(socket, index), "take " + name + " out of its bridge");
    } else {
        Require(rtnl_link_enslave_ifindex(socket, tavisdk::FindInterface(bridge.c_str()), index),
                "put " + name + " into the bridge " + bridge);
    }
}

void SetUp(const std::string& name, bool up) {
    if ((up ? VEXANetIfUp : VEXANetIfDown)(name.c_str()) != 1) {
        throw Error("cannot switch " + name + (up ? " on" : " off"));
    }
}

// Every change for which now and wanted differ is made by one of these, in this order.

void MakeBridges(nl_sock* socket, const State& now, const State& wanted, const Names& names) {
    for (const std::string& name : names) {
        const Interface* interface = wanted.Find(name);
        if (interface != nullptr && interface->isBridge && now.Find(name) == nullptr) {
            MakeBridge(socket, name, interface->hardware);
        }
    }
}

void SetMasters(nl_sock* socket, const State& now, const State& wanted, const Names& names) {
    for (const std::string& name : names) {
        const Interface *is = now.Find(name), *shall = wanted.Find(name);
        if (is != nullptr && shall != nullptr && is->master != shall->master &&
            (!is->isRadio || shall->master.empty())) {
            SetMaster(socket, name, shall->master);
        }
    }
}

void RemoveRoutes(nl_sock* socket, const State& now, const State& wanted, const Names& names) {
    for (const Route& route : now.routes) {
        if (names.count(route.device) != 0 && !Has(wanted, route)) {
            rtnl_route_delete(socket, route.kernel.get(), 0);  // it may go with another
        }
    }
}

void RemoveAddresses(nl_sock* socket, const State& now, const State& wanted, const Names& names) {
    for (const std::string& name : names) {
        const Interface *is = now.Find(name), *shall = wanted.Find(name);
        for (size_t i = 0; is != nullptr && shall != nullptr && i < is->addresses.size(); ++i) {
            const Address& address = is->addresses[i];
            if (!Has(*shall, address.text)) {
                const int result = rtnl_addr_delete(socket, address.kernel.get(), 0);
                // With the first address of a network, the kernel removes the further ones.
                Require(result == -NLE_NOADDR ? 0 : result,
                        "take " + address.text + " from " + name);
            }
        }
    }
}

// An interface that is not there (unplugged) is passed over. A radio is switched by who uses it.
void SwitchAndAddress(nl_sock* socket, const State& now, const State& wanted, const Names& names) {
    for (const std::string& name : names) {
        const Interface* shall = wanted.Find(name);
        if (shall == nullptr || (now.Find(name) == nullptr && !shall->isBridge)) {
            continue;
        }
        if (shall->isUp && !shall->isRadio) {
            SetUp(name, true);
        }
        for (const Address& address : shall->addresses) {
            Add(socket, address, name);
        }
        if (!shall->isUp && !shall->isRadio) {
            SetUp(name, false);
        }
    }
}

void RemoveBridges(nl_sock* socket, const State& now, const State& wanted, const Names& names) {
    for (const std::string& name : names) {
        const Interface* is = now.Find(name);
        if (is != nullptr && is->isBridge && wanted.Find(name) == nullptr) {
            RemoveInterface(socket, name);
        }
    }
}

// Routes to neighbours come first: gateways of the others are reached through them.
void AddRoutes(nl_sock* socket, const State& wanted, const Names& names) {
    for (const bool toNeighbours : {true, false}) {
        for (const Route& route : wanted.routes) {
            if (names.count(route.device) != 0 && route.gateway.empty() == toNeighbours) {
                Add(socket, route);
            }
        }
    }
}

}  // namespace

const Interface* State::Find(const std::string& name) const {
    const auto found = interfaces.find(name);
    return found == interfaces.end() ? nullptr : &found->second;
}

Names State::PortsOf(const std::string& bridge) const {
    Names ports;
    for (const auto& [name, interface] : interfaces) {
        if (interface.master == bridge) {
            ports.insert(name);
        }
    }
    return ports;
}

bool Has(const Interface& interface, const std::string& address) {
    return std::any_of(interface.addresses.begin(), interface.addresses.end(),
                       [&](const Address& own) { return own.text == address; });
}

bool Has(const State& state, const Route& route) {
    return std::any_of(state.routes.begin(), state.routes.end(), [&](const Route& other) {
        return other.text == route.text && other.device == route.device;
    });
}

State ReadState() {
    const Socket socket = tavisdk::OpenRouteSocket();
    State state;
    ReadLinks(socket.get(), state);
    ReadAddresses(socket.get(), state);
    ReadRoutes(socket.get(), AF_INET, state);
    ReadRoutes(socket.get(), AF_INET6, state);
    return state;
}

void BringAbout(const State& wanted, const Names& names) {
    const Socket socket = tavisdk::OpenRouteSocket();
    const State now = ReadState();
    MakeBridges(socket.get(), now, wanted, names);
    SetMasters(socket.get(), now, wanted, names);
    RemoveRoutes(socket.get(), now, wanted, names);
    RemoveAddresses(socket.get(), now, wanted, names);
    SwitchAndAddress(socket.get(), now, wanted, names);
    RemoveBridges(socket.get(), now, wanted, names);
    AddRoutes(socket.get(), wanted, names);
}

std::string FirstDifference(const State& wanted, const Names& names) {
    const State now = ReadState();
    for (const std::string& name : names) {
        const Interface *is = now.Find(name), *shall = wanted.Find(name);
        if (is != nullptr && shall == nullptr) {
            return name + " is still there";
        }
        if (is == nullptr && shall != nullptr) {
            return name + " is not there";
        }
        if (shall == nullptr) {
            continue;
        }
        if (is->master != shall->master) {
            return name + (shall->master.empty() ? " is still in a bridge"
                                                 : " is not in " + shall->master);
        }
        for (const Address& address : shall->addresses) {
            if (!Has(*is, address.text)) {
                return name + " has no address " + address.text;
            }
        }
    }
    for (const Route& route : wanted.routes) {
        if (names.count(route.device) != 0 && !Has(now, route)) {
            return "there is no route " + route.text + " on " + route.device;
        }
    }
    return "";
}

}  // namespace taviwireless::network
