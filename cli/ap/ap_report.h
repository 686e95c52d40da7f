#ifndef TAVIWIRELESS_CLI_AP_AP_REPORT_H
#define TAVIWIRELESS_CLI_AP_AP_REPORT_H

#include "cli/ap/access_point.h"
#include "cli/report.h"

namespace taviwireless::cli {

Report Describe(const APStatus& status);
// Secrets are hidden unless showSecrets.
Report Describe(WirelessAPSettings settings, bool showSecrets = false);

}  // namespace taviwireless::cli

#endif
