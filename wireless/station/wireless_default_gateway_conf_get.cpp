// SPDX-License-Identifier: MIT
// The gateway that the Wi-Fi connection should use.
#include <tavicore/keyvalue.h>
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include <cstdio>
#include <string>

#include "common/log.h"
#include "wireless/rules/paths.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"

namespace taviwireless::wireless {

namespace {

int Get(char* buf, size_t size) {
    const std::string interface = WirelessInterface();
    if (buf == nullptr || size == 0 || interface.empty()) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    *buf = '\0';
    if (BlTAVILnxIsDHCP(interface.c_str())) {
        // A lease without a gateway is an answer, too.
        const std::string lease = std::string(kDhcpClientPrefix) + interface + ".info";
        VEXACFileGetKeyValue(lease.c_str(), "GATEWAY", buf, size);
        return 0;
    }
    WirelessStatus status;
    char bssid[18];
    TAVIWirelessBssidStringGet(TAVIWirelessStatusGet(&status)->network.bssid, bssid, sizeof bssid);
    WirelessConf conf;
    if (TAVIWirelessConfGet(bssid, &conf) != 0) {
        TAVI_LOG_ERROR("Failed to get configuration of %s", bssid);
        return -1;
    }
    snprintf(buf, size, "%s", conf.gateway);
    return 0;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessDefaultGatewayConfGet_core(char* buf, size_t size) {
    return TAVI_GUARDED(-1, [=] { return taviwireless::wireless::Get(buf, size); });
}
