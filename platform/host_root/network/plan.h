// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_PLAN_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_PLAN_H

#include <map>
#include <string>

#include "platform/host_root/network/origins.h"
#include "platform/host_root/network/settings.h"
#include "platform/host_root/network/state.h"

namespace taviwireless::network {

// What a restart is to bring about.
struct Plan {
    Settings settings;
    State now;
    State wanted;
    Names names;                             // the interfaces that it touches
    std::map<std::string, Origins> origins;  // of each bridge, as they will be
    Names clients;                           // interfaces on which a DHCP client runs now ...
    Names wantedClients;                     // ... and shall run
};

// Changes nothing. Throws Error when the settings name what is no bridge, or would cut the machine
// off.
Plan MakePlan(const Settings& settings);

// The plan for a person: aligned lines.
std::string Rendered(const Plan& plan);

}  // namespace taviwireless::network

#endif
