// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_DRY_RUN_H
#define TAVIWIRELESS_CLI_AP_DRY_RUN_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

namespace taviwireless::cli {

// What switching the access point on would change in the machine's network, in lines for a person,
// from the network program. Throws CommandError when that refuses.
std::vector<std::string> PlanOfEnabling(const WirelessAPConf& conf);

}  // namespace taviwireless::cli

#endif
