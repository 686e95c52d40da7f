// SPDX-License-Identifier: MIT
// Giving the wireless interface the address of a saved network.
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include "base/fixed_field.h"
#include "base/interface_name.h"
#include "common/log.h"
#include "wireless/rules/dhcp.h"

int TAVIWirelessIfconfigSet(const char* interface, const WirelessConf* conf) {
    using namespace taviwireless;
    if (interface == nullptr || conf == nullptr || !IsInterfaceName(interface)) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    TAVINetCard card{};
    CopyField(card.interface, interface);
    if (wireless::IsDHCP(*conf)) {
        if (TAVIIGetDHCPTestNetInfo(&card) < 0) {
            TAVI_LOG_ERROR("Failed to get IP from DHCP");
        }
    } else {
        card.isStatic = 1;
        CopyField(card.address, conf->ipAddr);
        CopyField(card.netmask, conf->netmask);
    }
    if (TAVINetSetCard1(&card, 0) < 0) {
        TAVI_LOG_ERROR("Failed to set network interface");
        return -1;
    }
    return 0;
}
