// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_INTERFACE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_INTERFACE_H

#include <tavisdk/wireless.h>

#include <string>

#include "base/interface_name.h"

namespace taviwireless::wireless {

// The wireless interface as the SDK names it; empty when it names none.
inline std::string WirelessInterface() {
    const char* name = TAVIWirelessInterfaceGet();
    return name != nullptr && IsInterfaceName(name) ? name : "";
}

}  // namespace taviwireless::wireless

#endif
