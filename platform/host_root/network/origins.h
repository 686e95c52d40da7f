// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_ORIGINS_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_ORIGINS_H

#include <set>
#include <string>
#include <utility>

// Where the addresses of a bridge came from: those that it got from an interface go back to that
// when it leaves.
namespace taviwireless::network {

// (INTERFACE, "10.9.0.5/16") for what moved with an interface, (INTERFACE, "") for one that this
// program put into the bridge, (BRIDGE, "10.1.14.1/24") for what the settings gave.
using Origins = std::set<std::pair<std::string, std::string>>;

constexpr char kForAccessPoint[] = "access-point";

// Origins are kept in "/var/run", which like the bridge is gone after a restart of the machine.
Origins ReadOrigins(const std::string& bridge);
void WriteOrigins(const std::string& bridge, const Origins& origins);

}  // namespace taviwireless::network

#endif
