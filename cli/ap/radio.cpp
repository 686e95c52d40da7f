#include "cli/ap/radio.h"

#include <algorithm>

#include "cli/ap/setting_words.h"
#include "cli/command_line.h"

namespace taviwireless::cli {

namespace {

constexpr int32_t kAnyChannel = 0;  // hostapd chooses
constexpr int32_t kChannels24[] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13};
constexpr int32_t kChannelOfB = 14;  // at 2.4 GHz, for 802.11b alone
constexpr int32_t kChannels5[] = {36,  40,  44,  48,  52,  56,  60,  64,  100, 104, 108, 112, 116,
                                  120, 124, 128, 132, 136, 140, 144, 149, 153, 157, 161, 165};
// At 5 GHz the direction of the second half of a wide channel is written for these only.
constexpr int32_t kLastWideChannel5 = 64;

template <size_t Count>
bool IsOneOf(const int32_t (&channels)[Count], int32_t channel) {
    return std::find(std::begin(channels), std::end(channels), channel) != std::end(channels);
}

void CheckChannel(const WirelessAPConf& conf) {
    if (conf.channel == kAnyChannel) {
        return;
    }
    if (BandWord(conf) == "5" && !IsOneOf(kChannels5, conf.channel)) {
        throw CommandError(kUsage, "there is no channel " + ChannelWord(conf) +
                                       " at 5 GHz; channel is auto, 36 to 64 and 100 to 144 in "
                                       "steps of 4, or 149, 153, 157, 161, 165");
    }
    const bool isAt24 = IsOneOf(kChannels24, conf.channel) ||
                        (conf.channel == kChannelOfB && ModeWord(conf) == "b");
    if (BandWord(conf) == "2.4" && !isAt24) {
        throw CommandError(kUsage, "there is no channel " + ChannelWord(conf) +
                                       " at 2.4 GHz in this mode; channel is auto or 1 to 13, or "
                                       "14 in mode b");
    }
}

void CheckWidth(const WirelessAPConf& conf) {
    const bool hasRoom = BandWord(conf) == "2.4" ||
                         (conf.channel != kAnyChannel && conf.channel <= kLastWideChannel5);
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

void SetChannelWord(WirelessAPConf& conf, const std::string& word) {
    const bool isNumber = !word.empty() && word.size() <= 3 && word[0] != '0' &&
                          word.find_first_not_of("0123456789") == std::string::npos;
    if (!isNumber && word != "auto") {
        throw CommandError(kUsage, "channel is auto or the number of a channel of the band");
    }
    conf.channel = isNumber ? std::stoi(word) : kAnyChannel;
}

int ChannelWidth(const WirelessAPConf& conf) {
    return Is80211n(conf) && (conf.htFlags & WIRELESS_AP_40_MHZ) != 0 ? 40 : 20;
}

void SetWidthWord(WirelessAPConf& conf, const std::string& word) {
    if (word != "20" && word != "40") {
        throw CommandError(kUsage, "width is 20 or 40 (MHz)");
    }
    if (word == "40" && !Is80211n(conf)) {
        throw CommandError(kUsage, "40 MHz need mode bgn, n or an");
    }
    conf.htFlags = word == "40" ? conf.htFlags | WIRELESS_AP_40_MHZ
                                : conf.htFlags & ~int32_t{WIRELESS_AP_40_MHZ};
}

void CheckRadio(const WirelessAPConf& conf) {
    if (ModeWord(conf).empty()) {
        throw CommandError(kUsage, "the stored mode is none that is known here; set mode as well");
    }
    CheckChannel(conf);
    CheckWidth(conf);
}

}  // namespace taviwireless::cli
