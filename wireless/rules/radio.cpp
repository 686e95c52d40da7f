// SPDX-License-Identifier: MIT
#include "wireless/rules/radio.h"

namespace taviwireless::wireless {

namespace {

constexpr int32_t kLastChannel24 = 13;
constexpr int32_t kChannelOfB = 14;  // at 2.4 GHz, for 802.11b alone

bool IsAt5GHz(int32_t channel) {
    const bool isInLowerBands =
        (channel >= 36 && channel <= 64) || (channel >= 100 && channel <= 144);
    return (isInLowerBands && channel % 4 == 0) ||
           (channel >= 149 && channel <= 165 && channel % 4 == 1);
}

}  // namespace

int32_t BandInUse(const WirelessAPConf& conf) {
    constexpr int32_t kWithoutNOnly = WIRELESS_AP_A | WIRELESS_AP_B | WIRELESS_AP_G;
    const bool isReduced = Is80211n(conf) && conf.band != WIRELESS_AP_N_ONLY;
    return isReduced ? conf.band & kWithoutNOnly : conf.band;
}

bool IsChannelOfBand(const WirelessAPConf& conf) {
    const int32_t band = BandInUse(conf);
    if (band == WIRELESS_AP_A) {
        return IsAt5GHz(conf.channel);
    }
    const bool isOfB = band == WIRELESS_AP_B && !Is80211n(conf) && conf.channel == kChannelOfB;
    return isOfB || (conf.channel >= 1 && conf.channel <= kLastChannel24);
}

const char* SecondHalf(int32_t band, int32_t channel) {
    if (band != WIRELESS_AP_A) {
        return channel < 6 ? "[HT40+]" : "[HT40-]";
    }
    if (channel < 36 || channel > 64 || channel % 4 != 0) {
        return "";
    }
    return channel % 8 == 4 ? "[HT40+]" : "[HT40-]";
}

}  // namespace taviwireless::wireless
