// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_KERNEL_OBJECTS_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_KERNEL_OBJECTS_H

#include <functional>
#include <memory>
#include <string>

#include "sdk/netlink.h"

// Addresses and routes with all that the kernel knows of them, so that they can be given to another
// interface, or back, unchanged.
namespace taviwireless::network {

struct Address {
    std::string text;  // "10.9.0.5/16"
    std::shared_ptr<rtnl_addr> kernel;
};

struct Route {
    std::string text;  // "default via 10.9.0.1 metric 100"
    std::string gateway;
    std::string device;
    bool isDefault;
    std::shared_ptr<rtnl_route> kernel;
};

// Throws Error with what was being done and the kernel's own words, unless result is a success.
void Require(int result, const std::string& doing);

void ForEach(nl_cache* cache, const std::function<void(nl_object*)>& visit);

// Whether somebody gave it to the interface, and not the kernel itself or a router of IPv6.
bool WasGiven(rtnl_addr* address);
bool WasGiven(rtnl_route* route);

Address Describe(rtnl_addr* address);
Route Describe(rtnl_route* route, const std::string& device);

// text is "10.9.0.5/16".
Address NewAddress(const std::string& text);
Route NewDefaultRoute(const std::string& gateway, unsigned int metric, const std::string& device);

// Whether the text of an address, such as "10.1.14.254", lies in the network of the other.
bool IsIn(const Address& network, const std::string& address);

// Gives them to an interface; one that it has already is left alone.
void Add(nl_sock* socket, const Address& address, const std::string& interface);
void Add(nl_sock* socket, const Route& route);

}  // namespace taviwireless::network

#endif
