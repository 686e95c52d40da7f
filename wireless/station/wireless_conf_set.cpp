// SPDX-License-Identifier: MIT
// Saving a network.
#include <tavicore/error.h>
#include <tavicore/section.h>
#include <taviwireless/wireless.h>

#include <ctime>

#include "common/log.h"
#include "common/sz_hash.h"
#include "wireless/rules/paths.h"
#include "wireless/rules/security.h"
#include "wireless/system/guarded.h"
#include "wireless/system/section_store.h"

namespace taviwireless::wireless {

namespace {

// Loads what was saved of the network earlier.
Found LoadSection(const char* section, SzHash& values) {
    const Found store = FindStore(kSavedNetworks, __FILE_NAME__, __LINE__);
    if (store != Found::kExisting) {
        return store;
    }
    const int result = VEXACFileGetSection(kSavedNetworks, section, values.Address());
    if (result < 0) {
        // Compatible with log readers: file and section stand in the wrong order.
        TAVI_LOG_ERROR("Failed to get section: %s from %s, errno=0x%X", kSavedNetworks, section,
                       VEXACErrGet());
        return Found::kFailed;
    }
    return result == 0 ? Found::kNew : Found::kExisting;
}

// Sets all values, or returns false.
bool SetValues(const WirelessConf& conf, const char* bssid, SzHash& values) {
    const WirelessNetwork& network = conf.network;
    const bool hasUser = SecurityOf(network) == Security::kEAP;
    return values.Set("KEY", conf.key) && values.Set("IPADDR", conf.ipAddr) &&
           values.Set("NETMASK", conf.netmask) && values.Set("GATEWAY", conf.gateway) &&
           values.Set("ESSID", network.essid) && values.Set("BSSID", bssid) &&
           values.Set("MODE", TAVIWirelessOpmodeStringGet(network.opmode)) &&
           values.Set("ACCESS_TIME", std::to_string(static_cast<long long>(time(nullptr)))) &&
           values.Set("AUTH", TAVIWirelessAuthStringGet(network.auth)) &&
           values.Set("ENCRYPT", TAVIWirelessEncryptStringGet(network.encrypt, 0)) &&
           (!hasUser || values.Set("USER", conf.user));
}

int SaveNetwork(const WirelessConf* conf) {
    if (conf == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    SzHash values(1024);
    if (!values) {
        TAVI_LOG_ERROR("Failed to alloc memory");
        return -1;
    }
    char section[128];
    TAVIWirelessBssidStringGet(conf->network.bssid, section, sizeof section);
    const Found found = LoadSection(section, values);
    if (found == Found::kFailed) {
        return -1;
    }
    if (!SetValues(*conf, section, values)) {
        TAVI_LOG_ERROR("Failed to alloc memory");
        return -1;
    }
    const bool isSaved =
        SaveSection(kSavedNetworks, found, section, values, __FILE_NAME__, __LINE__);
    return isSaved ? 0 : -1;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessConfSet(const WirelessConf* conf) {
    return TAVI_GUARDED(-1, [conf] { return taviwireless::wireless::SaveNetwork(conf); });
}
