// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"
#include "wireless/system/shell.h"

namespace taviwireless::wireless {

namespace {

int Set(const char* gateway) {
    const std::string interface = WirelessInterface();
    if (gateway == nullptr || *gateway == '\0' || interface.empty()) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    const Command addRoute(256, {"/sbin/route add default gw ", Argument{gateway}, " metric 0 dev ",
                                 Argument{interface}, " > /dev/null 2>&1"});
    return TAVI_RUN(addRoute) ? 0 : -1;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessDefaultGatewaySet(const char* gateway) {
    return TAVI_GUARDED(-1, [gateway] { return taviwireless::wireless::Set(gateway); });
}
