// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/system/driver_request.h"
#include "wireless/system/interface.h"

int TAVIWirelessOpmodeSet(int mode) {
    using namespace taviwireless::wireless;
    const char* name = TAVIWirelessOpmodeStringGet(mode);
    if (mode != WIRELESS_OPMODE_ADHOC && mode != WIRELESS_OPMODE_MANAGED) {
        TAVI_LOG_ERROR("Opmode(%s) isn't supported", name);
        return -1;
    }
    if (TAVIWirelessAdapterNum() <= 0) {
        TAVI_LOG_ERROR("There is no wireless USB adapter plugged");
        return -1;
    }
    iwreq argument{};
    argument.u.mode = static_cast<unsigned>(mode);
    const DriverResult result = RequestDriver(SIOCSIWMODE, argument);
    if (result == DriverResult::kNoSocket) {
        TAVI_LOG_ERROR("Cannot get socket.");
    } else if (result == DriverResult::kRefused) {
        TAVI_LOG_ERROR("Failed to set opmode[%s] of %s.", name, WirelessInterface().c_str());
    }
    return result == DriverResult::kDone ? 0 : -1;
}
