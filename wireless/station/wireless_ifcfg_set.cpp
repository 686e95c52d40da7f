// Giving the wireless interface the address of a saved network.
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include <cstdio>
#include <cstring>

#include "base/interface_name.h"
#include "common/log.h"

int TAVIWirelessIfconfigSet(const char* interface, const WirelessConf* conf) {
    if (interface == nullptr || conf == nullptr || !taviwireless::IsInterfaceName(interface)) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    TAVINetCard card{};
    strncpy(card.interface, interface, sizeof card.interface - 1);
    if (strcmp(conf->ipAddr, "DHCP") == 0) {
        if (TAVIIGetDHCPTestNetInfo(&card) < 0) {
            TAVI_LOG_ERROR("Failed to get IP from DHCP");
        }
    } else {
        card.isStatic = 1;
        snprintf(card.address, sizeof card.address, "%s", conf->ipAddr);
        snprintf(card.netmask, sizeof card.netmask, "%s", conf->netmask);
    }
    if (TAVINetSetCard1(&card, 0) < 0) {
        TAVI_LOG_ERROR("Failed to set network interface");
        return -1;
    }
    return 0;
}
