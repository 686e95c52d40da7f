// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_AP_REPORT_H
#define TAVIWIRELESS_CLI_AP_AP_REPORT_H

#include "cli/ap/access_point.h"
#include "cli/report.h"

namespace taviwireless::cli {

Report Describe(const APStatus& status);
// What switching it on has come to: a sentence, or the state with "remark".
Report DescribeSwitchedOn(const Switched& switched, WirelessAPConf conf);
// Secrets are hidden unless showSecrets.
Report Describe(WirelessAPSettings settings, bool showSecrets = false);

}  // namespace taviwireless::cli

#endif
