// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_BRIDGE_NAMES_H
#define TAVIWIRELESS_WIRELESS_RULES_BRIDGE_NAMES_H

// The network interfaces that belong to one purpose on every appliance.
namespace taviwireless::wireless {

// The bridge of the wireless LAN. Other ones belong to the wired network.
constexpr char kLocalBridge[] = "lbr0";
constexpr char kLocalAddress[] = "10.1.14.1";
constexpr char kLocalNetmask[] = "255.255.255.0";
constexpr char kLocalPrefix[] = "/24";  // the netmask in short

constexpr char kWiredInterface[] = "eth0";  // the first member of other bridges

constexpr char kGuestInterface[] = "gwlan";
constexpr char kGuestBridge[] = "gbr";

}  // namespace taviwireless::wireless

#endif
