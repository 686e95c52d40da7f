// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_DRIVER_REQUEST_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_DRIVER_REQUEST_H

#include <linux/wireless.h>

namespace taviwireless::wireless {

// kRefused also when there is no wireless interface to ask about.
enum class DriverResult { kDone, kNoSocket, kRefused };

// Sends a request of the wireless extensions (SIOCGIW..., SIOCSIW...) about the wireless interface.
// argument holds what is asked with, and then the answer; its interface name is filled in here.
DriverResult RequestDriver(unsigned long request, iwreq& argument);

}  // namespace taviwireless::wireless

#endif
