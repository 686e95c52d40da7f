// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_GUEST_NETWORK_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_GUEST_NETWORK_H

#include <tavicore/keyvalue.h>

#include "wireless/rules/paths.h"

namespace taviwireless::wireless {

// Whether the model has a guest network.
inline bool OffersGuestNetwork() {
    return VEXACFileCheckKeyValue(kModelInfo, "support_pci_wifi", "yes", 0) != 0;
}

}  // namespace taviwireless::wireless

#endif
