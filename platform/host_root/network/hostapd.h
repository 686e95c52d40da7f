// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_HOSTAPD_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_HOSTAPD_H

#include <string>

namespace taviwireless::network {

// Makes what hostapd is started with from the access point's files: those of the main network and,
// with guests, their block.
void WriteHostapdConf(const std::string& interface, bool withGuests);

}  // namespace taviwireless::network

#endif
