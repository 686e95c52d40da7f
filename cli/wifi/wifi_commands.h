// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_WIFI_COMMANDS_H
#define TAVIWIRELESS_CLI_WIFI_WIFI_COMMANDS_H

#include <string>
#include <vector>

#include "cli/options.h"

// What the commands about the Wi-Fi adapter do. Each throws CommandError when it fails.
namespace taviwireless::cli {

void ShowWifi(const Options& options);
void ListNetworks(const Options& options);
void ConnectWifi(const Options& options);
void DisconnectWifi(const Options& options);
void ConnectAutomatically(const Options& options);
void ListSavedNetworks(const Options& options);
void ShowSavedNetwork(const Options& options);
void EditSavedNetwork(const Options& options);
// How the changes that it takes begin: "user=", and "key" for what is read.
std::vector<std::string> SavedSettingWords();
void ForgetNetwork(const Options& options);
void SwitchRadio(const Options& options);
void WatchWifi(const Options& options);
void ShowSavedCode(const Options& options);
void CreateAdhoc(const Options& options);
void ChangeWifiMode(const Options& options);
void ShowWifiGateway(const Options& options);

}  // namespace taviwireless::cli

#endif
