#include <tavisdk/wireless.h>
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/shell.h"

int TAVIWirelessDefaultGatewaySet(const char* gateway) {
    using namespace taviwireless::wireless;
    if (gateway == nullptr || *gateway == '\0') {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    const Command addRoute(256, {"/sbin/route add default gw ", Argument{gateway}, " metric 0 dev ",
                                 Argument{TAVIWirelessInterfaceGet()}, " > /dev/null 2>&1"});
    return TAVI_RUN(addRoute) ? 0 : -1;
}
