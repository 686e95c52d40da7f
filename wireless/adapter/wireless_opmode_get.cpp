// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/system/driver_request.h"
#include "wireless/system/interface.h"

int TAVIWirelessOpmodeGet() {
    using namespace taviwireless::wireless;
    if (TAVIWirelessAdapterNum() <= 0) {
        return WIRELESS_OPMODE_UNKNOWN;
    }
    iwreq argument{};
    const DriverResult result = RequestDriver(SIOCGIWMODE, argument);
    if (result == DriverResult::kNoSocket) {
        TAVI_LOG_ERROR("Cannot get socket.");
    } else if (result == DriverResult::kRefused) {
        TAVI_LOG_ERROR("Failed to get information from ioctl with ifname[%s].",
                       WirelessInterface().c_str());
    }
    const bool isKnown =
        result == DriverResult::kDone && argument.u.mode <= WIRELESS_OPMODE_UNKNOWN;
    return isKnown ? static_cast<int>(argument.u.mode) : WIRELESS_OPMODE_UNKNOWN;
}
