#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/system/driver_request.h"
#include "wireless/system/interface.h"

using taviwireless::wireless::DriverResult;

int TAVIWirelessOpmodeSet(int mode) {
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
    switch (taviwireless::wireless::RequestDriver(SIOCSIWMODE, argument)) {
        case DriverResult::kNoSocket:
            TAVI_LOG_ERROR("Cannot get socket.");
            return -1;
        case DriverResult::kRefused:
            TAVI_LOG_ERROR("Failed to set opmode[%s] of %s.", name,
                           taviwireless::wireless::WirelessInterface().c_str());
            return -1;
        case DriverResult::kDone:
            break;
    }
    return 0;
}
