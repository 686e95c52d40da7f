// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_AP_CHANGES_H
#define TAVIWIRELESS_CLI_AP_AP_CHANGES_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

namespace taviwireless::cli {

// One setting to change. Its name is known; its value is not checked yet.
struct APChange {
    std::string key;
    std::string value;
};

// The settings there are, a line each with the values that it takes.
std::string APSettingsHelp();

// How they begin on a command line: "ssid=", and "key" for what is read.
std::vector<std::string> APSettingWords();

// "KEY=VALUE" each, or "KEY" alone for the secrets, which are read from standard input, a line each
// in this order. Nothing is read when there is a mistake.
std::vector<APChange> ReadAPChanges(const std::vector<std::string>& texts);

// The change of this setting; null when there is none.
const APChange* FindChange(const std::vector<APChange>& changes, const std::string& key);

// Changes the settings, whatever the order of the changes; throws when a value is not allowed.
void ApplyAPChanges(const std::vector<APChange>& changes, WirelessAPConf& conf);

// Throws unless an access point can work with the settings as a whole: much of this hostapd finds
// only when it starts, and some of it never.
void CheckAPConf(WirelessAPConf conf);

}  // namespace taviwireless::cli

#endif
