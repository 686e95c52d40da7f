// SPDX-License-Identifier: MIT
#include "cli/ap/channel_choice.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include "base/join.h"
#include "cli/ap/radio.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "cli/wifi/station.h"
#include "wireless/rules/radio.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

struct Load {
    int channel;
    int networks = 0;
    int strongest = 0;  // percent
};

// Whether a network disturbs an access point on this channel. At 2.4 GHz a channel is as wide as
// four steps; at 5 GHz the channels of 40 MHz are pairs from 36 up.
bool IsInTheWay(const WirelessAPConf& conf, int channel, int others) {
    constexpr int kFirst = 36;
    if (BandWord(conf) == "2.4") {
        return others <= 14 && std::abs(channel - others) < 5;
    }
    return channel == others || (ChannelWidth(conf) == 40 && others >= kFirst &&
                                 (channel - kFirst) / 8 == (others - kFirst) / 8);
}

bool IsAllowed(WirelessAPConf conf, int channel, const std::vector<int>& usable) {
    conf.channel = channel;
    const bool hasRoom = ChannelWidth(conf) == 20 ||
                         *wireless::SecondHalf(wireless::BandInUse(conf), channel) != '\0';
    return hasRoom && std::find(usable.begin(), usable.end(), channel) != usable.end();
}

std::vector<Load> Loads(const WirelessAPConf& conf, const std::vector<NetworkInRange>& networks,
                        const std::vector<int>& usable) {
    const std::vector<int> apart = BandWord(conf) == "2.4"
                                       ? std::vector<int>{1, 6, 11}
                                       : std::vector<int>{36, 40, 44, 48, 149, 153, 157, 161, 165};
    std::vector<Load> loads;
    for (const int channel : apart) {
        if (IsAllowed(conf, channel, usable)) {
            Load load{channel};
            for (const NetworkInRange& other : networks) {
                const WirelessNetwork& network = other.network;
                if (IsInTheWay(conf, channel, network.channel)) {
                    ++load.networks;
                    load.strongest = std::max(load.strongest, static_cast<int>(network.signal));
                }
            }
            loads.push_back(load);
        }
    }
    return loads;
}

std::string Reason(const Load& best, const std::vector<Load>& loads) {
    std::string alike;
    std::string fuller;
    for (const Load& load : loads) {
        const std::string channel = std::to_string(load.channel);
        if (load.networks == best.networks && load.strongest > best.strongest) {
            AddItem(alike, channel, " and ");
        } else if (load.networks > best.networks) {
            AddItem(fuller, channel + " has " + std::to_string(load.networks));
        }
    }
    const std::string count = best.networks == 0 ? "no" : std::to_string(best.networks);
    return "channel " + std::to_string(best.channel) + ": " + count +
           (best.networks == 1 ? " network" : " networks") +
           (alike.empty() || best.networks == 0 ? ""
            : alike.find(' ') == alike.npos && best.networks == 1
                ? ", weaker than that of " + alike
                : ", weaker than those of " + alike) +
           (fuller.empty() ? "" : "; " + fuller);
}

std::vector<int> UsableChannels() {
    const wireless::Pipe lines(wireless::Command(
        128, {"iwlist ", TAVIWirelessAPInterfaceGet(), " active_channel 2> /dev/null"}));
    std::vector<int> channels;
    for (int channel = 0; lines && fscanf(lines.get(), " %d%*[^\n]", &channel) == 1;) {
        channels.push_back(channel);
    }
    return channels;
}

}  // namespace

std::string TakeEmptiestChannel(WirelessAPConf& conf) {
    ShowProgress("Looking for the emptiest channel ...");
    conf.channel = wireless::kAnyChannel;
    try {
        const std::vector<Load> loads = Loads(conf, Scan(), UsableChannels());
        const auto best =
            std::min_element(loads.begin(), loads.end(), [](const auto& a, const auto& b) {
                return a.networks != b.networks ? a.networks < b.networks
                                                : a.strongest < b.strongest;
            });
        if (best != loads.end()) {
            conf.channel = best->channel;
            return Reason(*best, loads);
        }
        return "hostapd chooses the channel: the adapter offers none of those to choose from";
    } catch (const CommandError& error) {
        return std::string("hostapd chooses the channel: ") + error.what();
    }
}

}  // namespace taviwireless::cli
