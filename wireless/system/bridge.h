// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_BRIDGE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_BRIDGE_H

#include <tavisdk/bridge.h>

#include <optional>
#include <string>

namespace taviwireless::wireless {

// Why an access point cannot join a bridge of this name, as the end of a sentence that begins with
// "bridge"; empty when it can. There need be no such bridge yet.
std::string WhyNoBridge(const std::string& name);

struct Bridge {
    TAVINetBridge config;
    TAVINetBridgeMember member;
};

// Nothing when none of this name is stored.
std::optional<Bridge> StoredBridge(const char* name);
// As one is made for the access point of the interface.
Bridge NewBridge(const char* interface, const char* name);

}  // namespace taviwireless::wireless

#endif
