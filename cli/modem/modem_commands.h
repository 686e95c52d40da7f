// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_MODEM_COMMANDS_H
#define TAVIWIRELESS_CLI_MODEM_MODEM_COMMANDS_H

#include <string>
#include <vector>

#include "cli/options.h"

// What the commands about modems do. Each throws CommandError when it fails.
namespace taviwireless::cli {

void ListModems(const Options& options);
void ShowModem(const Options& options);
void ListInterfaces(const Options& options);
void ShowUsage(const Options& options);
void SendATCommand(const Options& options);
void WatchModems(const Options& options);

void UnlockSIM(const Options& options);
void ChangePIN(const Options& options);
void ProtectSIM(const Options& options);
void UnprotectSIM(const Options& options);
void UsePUK(const Options& options);

void ShowProfile(const Options& options);
void SetProfile(const Options& options);
// How the settings that it takes begin: "apn=", and "password" for what is read.
std::vector<std::string> ProfileSettingWords();
void ResetProfile(const Options& options);

void ConnectModem(const Options& options);
void DisconnectModem(const Options& options);
void ShowConnection(const Options& options);

}  // namespace taviwireless::cli

#endif
