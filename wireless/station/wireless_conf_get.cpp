// SPDX-License-Identifier: MIT
// Reading a saved network.
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/section.h>
#include <taviwireless/wireless.h>

#include <cstdlib>

#include "base/fixed_field.h"
#include "common/log.h"
#include "common/sz_hash.h"
#include "wireless/rules/paths.h"

namespace taviwireless::wireless {

namespace {

// A missing value makes the field empty.
const char* TextOf(const char* value) {
    return value != nullptr ? value : "";
}

int ParseIfThere(const char* value, int (*parse)(const char*)) {
    return value != nullptr ? parse(value) : 0;
}

void Fill(const SzHash& values, const char* section, WirelessConf* conf) {
    CopyField(conf->ipAddr, TextOf(values["IPADDR"]));
    CopyField(conf->netmask, TextOf(values["NETMASK"]));
    CopyField(conf->gateway, TextOf(values["GATEWAY"]));
    CopyField(conf->key, TextOf(values["KEY"]));
    CopyField(conf->network.essid, TextOf(values["ESSID"]));
    CopyField(conf->user, TextOf(values["USER"]));
    TAVIWirelessBssidParse(section, conf->network.bssid);
    conf->network.opmode = TAVIWirelessOpmodeParse(values["MODE"]);
    conf->network.auth = ParseIfThere(values["AUTH"], TAVIWirelessAuthParse);
    conf->network.encrypt = ParseIfThere(values["ENCRYPT"], TAVIWirelessEncryptParse);
    if (const char* time = values["ACCESS_TIME"]) {
        conf->accessTime = static_cast<int32_t>(strtoll(time, nullptr, 10));
    }
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessConfGet(const char* section, WirelessConf* conf) {
    using namespace taviwireless::wireless;
    if (section == nullptr || conf == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    *conf = {};
    taviwireless::SzHash values(1024);
    if (!values) {
        TAVI_LOG_ERROR("Failed to alloc memory");
        return -1;
    }
    if (VEXACFileGetSection(kSavedNetworks, section, values.Address()) < 1) {
        const int error = VEXACErrGet();
        if (!VEXACFileExist(kSavedNetworks)) {
            TAVI_LOG_ERROR("Configuration %s doen't exist", kSavedNetworks);
            return -1;
        }
        // Compatible with log readers: file and section stand in the wrong order.
        TAVI_LOG_ERROR("Not found or failed to get section: %s from %s, errno=0x%X", kSavedNetworks,
                       section, error);
        return -1;
    }
    Fill(values, section, conf);
    return 0;
}
