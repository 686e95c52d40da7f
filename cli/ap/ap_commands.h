// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_AP_COMMANDS_H
#define TAVIWIRELESS_CLI_AP_AP_COMMANDS_H

#include "cli/options.h"

// What the commands about the access point do. Each throws CommandError when it fails.
namespace taviwireless::cli {

void ShowAP(const Options& options);
void ShowAPSettings(const Options& options);
void SetAP(const Options& options);
void CheckAP(const Options& options);
void EnableAP(const Options& options);
void DisableAP(const Options& options);
void ServeHotspot(const Options& options);
void ShowAPCode(const Options& options);
void ListStations(const Options& options);

// Throws unless the user is root, and an adapter is plugged in that can be an access point.
void RequireAPSupport();

}  // namespace taviwireless::cli

#endif
