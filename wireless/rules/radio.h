// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_RADIO_H
#define TAVIWIRELESS_WIRELESS_RULES_RADIO_H

#include <taviwireless/wireless.h>

// What an access point does with its settings of band and channel.
namespace taviwireless::wireless {

constexpr int32_t kAnyChannel = 0;  // hostapd chooses

inline bool Is80211n(const WirelessAPConf& conf) {
    return conf.ieee80211n > 0;
}

// The band that hw_mode is made of. With 802.11n on, "n only" counts when it is the only bit;
// beside other bits it is dropped, since n is added to the protocol that they name. Without 802.11n
// a set of several bits stays, for which no hw_mode is written, like for any other unknown value.
int32_t BandInUse(const WirelessAPConf& conf);

// Whether there is such a channel in the band; a channel that hostapd chooses is none.
bool IsChannelOfBand(const WirelessAPConf& conf);

// Whether channels of 40 MHz are allowed.
inline bool IsWide(const WirelessAPConf& conf) {
    return (conf.htFlags & WIRELESS_AP_40_MHZ) != 0;
}

// On which side of the channel the second half of 40 MHz lies, as hostapd writes it; empty where it
// has none. At 5 GHz the channels are paired from 36 up; those above 64 are left to hostapd.
const char* SecondHalf(int32_t band, int32_t channel);

}  // namespace taviwireless::wireless

#endif
