// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_WIFI_REPORT_H
#define TAVIWIRELESS_CLI_WIFI_WIFI_REPORT_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

#include "cli/report.h"
#include "cli/wifi/station.h"

namespace taviwireless::cli {

// A row for each in the order that they have, or the sentence that there is none.
Report DescribeAll(const std::vector<NetworkInRange>& networks);
Report DescribeAll(const std::vector<WirelessConf>& confs);
// The key is hidden unless showSecrets.
Report Describe(const WirelessConf& conf, bool showSecrets = false);

// The adapter and its connection as they are now.
Report DescribeConnection();
// "wlan0: connected to HOME, 192.168.1.20"
std::string ConnectionLine(const WirelessStatus& status, const std::string& address);
// What a command that changed something ends with: "wlan0: connected to HOME, 192.168.1.20",
// or the document.
void PrintConnection(const Options& options);

}  // namespace taviwireless::cli

#endif
