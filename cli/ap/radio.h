// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_RADIO_H
#define TAVIWIRELESS_CLI_AP_RADIO_H

#include <string>

#include "cli/ap/setting_words.h"

namespace taviwireless::cli {

// "auto" or a number.
std::string ChannelWord(const WirelessAPConf& conf);
void SetChannelWord(APNetwork& network, const std::string& word);

// The width of a channel in MHz: 20, or 40 where the settings allow that and the mode knows it.
int ChannelWidth(const WirelessAPConf& conf);
void SetWidthWord(APNetwork& network, const std::string& word);

// Throws unless mode, channel and width fit each other.
void CheckRadio(const WirelessAPConf& conf);

}  // namespace taviwireless::cli

#endif
