// SPDX-License-Identifier: MIT
#include "cli/ap/radio.h"

#include "cli/command_error.h"
#include "wireless/rules/radio.h"

namespace taviwireless::cli {

namespace {

using wireless::kAnyChannel;

void CheckChannel(const WirelessAPConf& conf) {
    if (conf.channel == kAnyChannel || wireless::IsChannelOfBand(conf)) {
        return;
    }
    throw CommandError(
        kUsage,
        "there is no channel " + ChannelWord(conf) +
            (BandWord(conf) == "5"
                 ? " at 5 GHz; channel is auto, 36 to 64 and 100 to 144 in steps of 4, or "
                   "149, 153, 157, 161, 165"
                 : " at 2.4 GHz in this mode; channel is auto or 1 to 13, or 14 in mode b"));
}

void CheckWidth(const WirelessAPConf& conf) {
    const bool hasRoom = conf.channel == kAnyChannel ||
                         *wireless::SecondHalf(wireless::BandInUse(conf), conf.channel) != '\0';
    if (ChannelWidth(conf) == 40 && !hasRoom) {
        throw CommandError(kUsage, "channel " + ChannelWord(conf) +
                                       " has no room for 40 MHz at 5 GHz; those of 36 to 64 have, "
                                       "or add width=20");
    }
}

}  // namespace

std::string ChannelWord(const WirelessAPConf& conf) {
    return conf.channel == kAnyChannel ? "auto" : std::to_string(conf.channel);
}

void SetChannelWord(APNetwork& network, const std::string& word) {
    const bool isNumber = !word.empty() && word.size() <= 3 && word[0] != '0' &&
                          word.find_first_not_of("0123456789") == std::string::npos;
    if (!isNumber && word != "auto") {
        throw CommandError(kUsage, "channel is auto or the number of a channel of the band");
    }
    network.conf.channel = isNumber ? std::stoi(word) : kAnyChannel;
}

int ChannelWidth(const WirelessAPConf& conf) {
    return wireless::Is80211n(conf) && wireless::IsWide(conf) ? 40 : 20;
}

void SetWidthWord(APNetwork& network, const std::string& word) {
    if (word != "20" && word != "40") {
        throw CommandError(kUsage, "width is 20 or 40 (MHz)");
    }
    if (word == "40" && !wireless::Is80211n(network.conf)) {
        throw CommandError(kUsage, "40 MHz need mode bgn, n or an");
    }
    int32_t& flags = network.conf.htFlags;
    flags = word == "40" ? flags | WIRELESS_AP_40_MHZ : flags & ~int32_t{WIRELESS_AP_40_MHZ};
}

void CheckRadio(const WirelessAPConf& conf) {
    if (ModeWord(conf).empty()) {
        throw CommandError(kUsage, "the stored mode is none that is known here; set mode as well");
    }
    CheckChannel(conf);
    CheckWidth(conf);
}

}  // namespace taviwireless::cli
