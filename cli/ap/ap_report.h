#ifndef TAVIWIRELESS_CLI_AP_AP_REPORT_H
#define TAVIWIRELESS_CLI_AP_AP_REPORT_H

#include <json/forwards.h>

#include "cli/ap/access_point.h"
#include "cli/report.h"

namespace taviwireless::cli {

// What is not known is null in documents and "-" in tables. Secrets are hidden unless showSecrets.

Json::Value ToJson(const APStatus& status);
Table StatusTable(const APStatus& status);

Json::Value ToJson(WirelessAPSettings settings, bool showSecrets);
Table ShowTable(WirelessAPSettings settings, bool showSecrets);

}  // namespace taviwireless::cli

#endif
