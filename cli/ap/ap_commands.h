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

}  // namespace taviwireless::cli

#endif
