#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/system/driver_request.h"
#include "wireless/system/interface.h"

using taviwireless::wireless::DriverResult;

int TAVIWirelessOpmodeGet(void) {
    if (TAVIWirelessAdapterNum() <= 0) {
        return WIRELESS_OPMODE_UNKNOWN;
    }
    iwreq argument{};
    switch (taviwireless::wireless::RequestDriver(SIOCGIWMODE, argument)) {
        case DriverResult::kNoSocket:
            TAVI_LOG_ERROR("Cannot get socket.");
            return WIRELESS_OPMODE_UNKNOWN;
        case DriverResult::kRefused:
            TAVI_LOG_ERROR("Failed to get information from ioctl with ifname[%s].",
                           taviwireless::wireless::WirelessInterface().c_str());
            return WIRELESS_OPMODE_UNKNOWN;
        case DriverResult::kDone:
            break;
    }
    const unsigned mode = argument.u.mode;
    return mode > WIRELESS_OPMODE_UNKNOWN ? WIRELESS_OPMODE_UNKNOWN : static_cast<int>(mode);
}
