// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_SUPPLICANT_SOCKET_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_SUPPLICANT_SOCKET_H

#include <string>

#include "base/unique_fd.h"

namespace taviwireless::wireless {

// A socket to which the supplicant of the interface sends its events; none while it does not run.
UniqueFd AttachToSupplicant(const std::string& interface);

}  // namespace taviwireless::wireless

#endif
