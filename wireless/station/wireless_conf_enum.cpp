// SPDX-License-Identifier: MIT
#include "common/log.h"
#include "wireless/station/saved_networks.h"

int TAVIWirelessConfEnum(WirelessLink* confs) {
    return taviwireless::wireless::ListSavedNetworks(confs, __FILE_NAME__, __LINE__);
}
