// SPDX-License-Identifier: MIT
// Makes the adapter create, or join, an ad-hoc network.
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include <cstring>
#include <string>

#include "common/log.h"
#include "wireless/rules/security.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"
#include "wireless/system/shell.h"

namespace taviwireless::wireless {

namespace {

constexpr size_t kCommandSize = 128;

bool IsSuitable(const WirelessConf& conf, const char* interface) {
    const int encrypt = conf.network.encrypt;
    if (conf.network.opmode != WIRELESS_OPMODE_ADHOC) {
        TAVI_LOG_ERROR("Interface %s is not Adhoc mode.", interface);
        return false;
    }
    if (encrypt != WIRELESS_ENCRYPT_NONE && encrypt != WIRELESS_ENCRYPT_WEP) {
        TAVI_LOG_ERROR("Adhoc mode does not support encryption [%s].",
                       TAVIWirelessEncryptStringGet(encrypt, 0));
        return false;
    }
    return true;
}

// The mode can be changed while the interface is down only.
bool EnterAdhocMode(const char* interface) {
    if (VEXANetIfDown(interface) == 0) {
        TAVI_LOG_ERROR("Failed to deactivate network interface [%s].", interface);
        return false;
    }
    if (TAVIWirelessOpmodeSet(WIRELESS_OPMODE_ADHOC) < 0) {
        TAVI_LOG_ERROR("Failed to set Ad-Hoc mode of %s.", interface);
        return false;
    }
    return true;
}

bool SetEssid(const char* interface, const WirelessNetwork& network) {
    const Argument essid{std::string(network.essid, strnlen(network.essid, WIRELESS_ESSID_SIZE))};
    const Command command(kCommandSize,
                          {"/sbin/iwconfig ", interface, " essid ", essid, " > /dev/null 2>&1"});
    return TAVI_RUN(command);
}

bool SetKey(const char* interface, const WirelessConf& conf) {
    if (conf.network.encrypt == WIRELESS_ENCRYPT_NONE) {
        const Command command(kCommandSize, {"/sbin/iwconfig ", interface, " key off"});
        return TAVI_RUN(command);
    }
    const Argument key{std::string(conf.key, strnlen(conf.key, WIRELESS_KEY_SIZE)), true};
    const bool isText = IsWepText(key.text);
    if (!isText && !IsWepHexadecimal(key.text)) {
        TAVI_LOG_ERROR("The key is not standard WEP format.");
        return false;
    }
    const Command command(
        kCommandSize, {"/sbin/iwconfig ", interface, isText ? " key open s:" : " key open ", key,
                       " > /dev/null 2>&1"});
    return TAVI_RUN(command);
}

int Create(const WirelessConf* conf) {
    if (conf == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    if (TAVIWirelessAdapterNum() <= 0) {
        TAVI_LOG_ERROR("There is no wireless USB adapter plugged");
        return -1;
    }
    const std::string name = WirelessInterface();
    if (name.empty()) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    const char* interface = name.c_str();
    if (!IsSuitable(*conf, interface) || !EnterAdhocMode(interface) ||
        !SetEssid(interface, conf->network) || !SetKey(interface, *conf)) {
        return -1;
    }
    if (VEXANetIfUp(interface) == 0) {
        TAVI_LOG_ERROR("Failed to activate network interface %s", interface);
        return -1;
    }
    return 0;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessAdhocCreate(const WirelessConf* conf) {
    return TAVI_GUARDED(-1, [conf] { return taviwireless::wireless::Create(conf); });
}
