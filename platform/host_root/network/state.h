// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_STATE_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_STATE_H

#include <map>
#include <set>
#include <string>
#include <vector>

#include "platform/host_root/network/kernel_objects.h"

// The machine's interfaces, as they are and as they shall be.
namespace taviwireless::network {

struct Interface {
    bool isBridge = false;
    bool isRadio =
        false;  // it joins a bridge by hostapd: the kernel refuses one that is no access point
    bool isUp = false;
    std::string master;    // the bridge that it is in
    std::string hardware;  // its address
    std::vector<Address> addresses;
};

using Names = std::set<std::string>;

struct State {
    std::map<std::string, Interface> interfaces;
    std::vector<Route> routes;

    const Interface* Find(const std::string& name) const;
    Names PortsOf(const std::string& bridge) const;
};

bool Has(const Interface& interface, const std::string& address);
bool Has(const State& state, const Route& route);

State ReadState();

// Makes the interfaces of these names what the state says; a bridge that is not in it is removed.
// Throws Error, with part of it done.
void BringAbout(const State& wanted, const Names& names);

// The first thing that is not as wanted, as a sentence; empty when all is.
std::string FirstDifference(const State& wanted, const Names& names);

}  // namespace taviwireless::network

#endif
