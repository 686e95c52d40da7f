#ifndef TAVIWIRELESS_CLI_AP_CHANNEL_CHOICE_H
#define TAVIWIRELESS_CLI_AP_CHANNEL_CHOICE_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

namespace taviwireless::cli {

struct ChannelChoice {
    int channel = 0;
    std::string reason;  // "channel 11: 1 network, weaker than those of 1 and 6"
};

// The channel for these settings on which the fewest networks are and, of such, the weakest. Only
// channels that do not overlap each other are looked at and, at 5 GHz, those that need no look-out
// for radars. usable: what the adapter offers.
ChannelChoice ChooseChannel(const WirelessAPConf& conf,
                            const std::vector<WirelessNetwork>& networks,
                            const std::vector<int>& usable);

// The choice by a scan; when there can be none, channel 0, which leaves it to hostapd, and why.
ChannelChoice FindEmptiestChannel(const WirelessAPConf& conf);

}  // namespace taviwireless::cli

#endif
