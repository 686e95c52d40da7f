// SPDX-License-Identifier: MIT
#include "cli/wifi/saved_networks.h"

#include <dlfcn.h>
#include <tavicore/section.h>
#include <tavicore/szhash.h>

#include <algorithm>
#include <cstring>

#include "cli/adapter/credentials.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "cli/wifi/library_list.h"
#include "cli/wifi/network_name.h"
#include "wireless/rules/paths.h"
#include "wireless/system/files.h"

namespace taviwireless::cli {

namespace {

constexpr char kNameServers[] = "DNS";
constexpr char kAskTheLog[] = "; the system log tells why";

struct Hash {
    Hash() = default;
    ~Hash() { VEXACSzHashFree(values); }
    Hash(const Hash&) = delete;
    Hash& operator=(const Hash&) = delete;
    VEXACSzHash* values = VEXACSzHashAlloc(64);  // moves when it grows
};

CommandError StoreError(const char* what) {
    return {kFailure, std::string("cannot ") + what + " in " + wireless::kSavedNetworks +
                          ", which may not be writable, or held by another program"};
}

}  // namespace

std::vector<WirelessConf> SavedNetworks() {
    if (wireless::IsMissing(wireless::kSavedNetworks)) {
        return {};  // none was ever saved
    }
    WirelessLink confs{&confs, &confs};
    if (TAVIWirelessConfEnumByAtime(&confs) != 0) {
        throw CommandError(kFailure, std::string("cannot read the saved networks in ") +
                                         wireless::kSavedNetworks + kAskTheLog);
    }
    return TakeList<WirelessConf>(confs);
}

std::vector<WirelessConf> SavedNetworksCalled(const std::string& name) {
    const NetworkName wanted(name);
    std::vector<WirelessConf> saved = SavedNetworks();
    saved.erase(std::remove_if(saved.begin(), saved.end(),
                               [&](const auto& conf) { return !wanted.IsOf(conf.network); }),
                saved.end());
    if (saved.empty()) {
        throw CommandError(kNotFound, "no network " + Printable(name) +
                                          " is saved; taviwireless wifi saved list shows those "
                                          "that are");
    }
    return saved;
}

const WirelessConf* FindSaved(const std::vector<WirelessConf>& saved,
                              const WirelessNetwork& network) {
    const auto find = [&](const auto& isIt) -> const WirelessConf* {
        const auto found = std::find_if(saved.begin(), saved.end(),
                                        [&](const auto& conf) { return isIt(conf.network); });
        return found == saved.end() ? nullptr : &*found;
    };
    const auto* ofAccessPoint = find([&](const WirelessNetwork& known) {
        return memcmp(known.bssid, network.bssid, sizeof known.bssid) == 0 &&
               SecurityOf(known) == SecurityOf(network);
    });
    return ofAccessPoint != nullptr ? ofAccessPoint : find([&](const WirelessNetwork& known) {
        return strcmp(known.essid, network.essid) == 0 && SecurityOf(known) == SecurityOf(network);
    });
}

std::string SavedNameServers(const WirelessConf& conf) {
    char servers[WIRELESS_KEY_SIZE] = "";
    VEXACFileGetSectionValue(wireless::kSavedNetworks, BssidText(conf.network.bssid).c_str(),
                             kNameServers, servers, sizeof servers);
    return servers;
}

void SaveValues(const WirelessConf& conf, const SavedValues& values) {
    const std::string section = BssidText(conf.network.bssid);
    Hash hash;
    bool isFilled =
        hash.values != nullptr &&
        VEXACFileGetSection(wireless::kSavedNetworks, section.c_str(), &hash.values) == 1;
    for (const auto& [key, value] : values) {
        isFilled = isFilled && VEXACSzHashSetValue(&hash.values, key, value.c_str()) == 0;
    }
    if (!isFilled || VEXACFileSetSection(wireless::kSavedNetworks, section.c_str(), nullptr,
                                         hash.values, wireless::kSectionLine) != 1) {
        throw StoreError("change the network");
    }
}

SavedValues AddressValues(const WirelessConf& conf, const std::string& nameServers) {
    return {{"IPADDR", conf.ipAddr},
            {"NETMASK", conf.netmask},
            {"GATEWAY", conf.gateway},
            {kNameServers, nameServers}};
}

void RemoveSaved(const WirelessConf& conf) {
    using Remove = int (*)(const char* file, const char* section);
    const auto remove = reinterpret_cast<Remove>(dlsym(RTLD_DEFAULT, "VEXACFileRemoveSection"));
    const std::string section = BssidText(conf.network.bssid);
    if (remove == nullptr) {
        throw CommandError(kFailure,
                           "the SDK of this system has no call that removes a network; "
                           "take the section [" +
                               section + "] out of " + wireless::kSavedNetworks);
    }
    if (remove(wireless::kSavedNetworks, section.c_str()) != 1) {
        throw StoreError("forget the network");
    }
}

}  // namespace taviwireless::cli
