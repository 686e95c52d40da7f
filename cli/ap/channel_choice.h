// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_CHANNEL_CHOICE_H
#define TAVIWIRELESS_CLI_AP_CHANNEL_CHOICE_H

#include <taviwireless/wireless.h>

#include <string>

namespace taviwireless::cli {

// Sets the channel on which the fewest networks are and, of such, the weakest, by a scan. Only
// channels that do not overlap each other are looked at and, at 5 GHz, those that need no look-out
// for radars. Without a scan, the channel is left to hostapd. Returns why: "channel 11: 1 network,
// weaker than those of 1 and 6".
std::string TakeEmptiestChannel(WirelessAPConf& conf);

}  // namespace taviwireless::cli

#endif
