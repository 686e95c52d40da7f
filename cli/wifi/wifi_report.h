#ifndef TAVIWIRELESS_CLI_WIFI_WIFI_REPORT_H
#define TAVIWIRELESS_CLI_WIFI_WIFI_REPORT_H

#include <json/forwards.h>
#include <taviwireless/wireless.h>

#include <string>
#include <vector>

#include "cli/command_line.h"
#include "cli/report.h"

namespace taviwireless::cli {

// What is not known is null in documents and "-" in tables. Keys are hidden unless showSecrets.

std::string BssidText(const unsigned char (&bssid)[6]);
std::string SecurityText(const WirelessNetwork& network);

Json::Value ToJson(const WirelessNetwork& network);
// The networks in the order that they have.
Json::Value ToJson(const std::vector<WirelessNetwork>& networks);
// A row for each network, or the sentence that there is none.
std::string ListText(const std::vector<WirelessNetwork>& networks);

// The adapter as it is now; address is that of its interface.
Json::Value ToJson(const WirelessStatus& status, const std::string& address);
// What a command that changed something ends with: "wlan0: connected to HOME, 192.168.1.20",
// or the document.
void ReportWifi(const Options& options);
// A row for each value.
Table StatusTable(const WirelessStatus& status, const std::string& address);

Json::Value ToJson(const WirelessConf& conf, bool showSecrets);
Json::Value ToJson(const std::vector<WirelessConf>& confs);
std::string ListText(const std::vector<WirelessConf>& confs);
Table ShowTable(const WirelessConf& conf, bool showSecrets);

}  // namespace taviwireless::cli

#endif
