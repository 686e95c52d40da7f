// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_HOSTAPD_H
#define TAVIWIRELESS_CLI_AP_HOSTAPD_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

#include "wireless/rules/hostapd_conf.h"

namespace taviwireless::cli {

struct ConfFile {
    std::string path;
    wireless::HostapdConf conf;
};

// The files with which the access point would be started.
std::vector<ConfFile> RenderConfFiles(const WirelessAPConf& conf);

// Asks the hostapd that serves this interface, such as "ping" or "all_sta". Returns the lines of its
// answer; none where there is no such hostapd.
std::vector<std::string> AskHostapd(const std::string& interface, const char* question);
bool ServesHostapd(const std::string& interface);

// Whether the access point runs with these settings: nothing would change if it were switched on.
bool IsServed(const WirelessAPConf& conf);

}  // namespace taviwireless::cli

#endif
