// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_SAVED_NETWORKS_H
#define TAVIWIRELESS_CLI_WIFI_SAVED_NETWORKS_H

#include <taviwireless/wireless.h>

#include <string>
#include <utility>
#include <vector>

namespace taviwireless::cli {

// The store of saved networks: what the library keeps of them, and their name servers, which it
// knows nothing of and leaves in their sections. Failures throw CommandError.

// The last used first.
std::vector<WirelessConf> SavedNetworks();
// Those called that, by SSID or BSSID; throws when there is none.
std::vector<WirelessConf> SavedNetworksCalled(const std::string& name);
// The one of this access point, or else the last used of the same name and kind of security; null
// when there is none.
const WirelessConf* FindSaved(const std::vector<WirelessConf>& saved,
                              const WirelessNetwork& network);

// "ADDRESS,ADDRESS"; empty when none are saved with it.
std::string SavedNameServers(const WirelessConf& conf);

// Sets keys of the section of a saved network, all or none.
using SavedValues = std::vector<std::pair<const char*, std::string>>;
void SaveValues(const WirelessConf& conf, const SavedValues& values);
// What is written for the address of a network, and for its name servers.
SavedValues AddressValues(const WirelessConf& conf, const std::string& nameServers);

// Only the host edition of the SDK has a call for that.
void RemoveSaved(const WirelessConf& conf);

}  // namespace taviwireless::cli

#endif
