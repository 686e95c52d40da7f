// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_SETTING_WORDS_H
#define TAVIWIRELESS_CLI_AP_SETTING_WORDS_H

#include <taviwireless/wireless.h>

#include <string>

namespace taviwireless::cli {

// One of the two networks of an access point, in its record, which outlives it.
struct APNetwork {
    WirelessAPConf& conf;
    char (&ssid)[WIRELESS_AP_SSID_SIZE];
    int32_t& hidden;
    int32_t& maxStations;
    int32_t& security;
    WirelessAPSecret& secret;
    bool isForGuests;
};
APNetwork MainNetwork(WirelessAPConf& conf);
APNetwork GuestNetwork(WirelessAPConf& conf);

// What a person calls the settings. The functions that return a word return the empty text for a
// value without a word. The functions that set something by its word throw CommandError for any
// other word, with those that are allowed.

// "open", "wpa2" ... A kind of security that the network did not have begins without a secret.
std::string SecurityWord(const APNetwork& network);
void SetSecurityWord(APNetwork& network, const std::string& word);

// "tkip", "aes", "both"; of WPA only.
std::string CipherWord(const APNetwork& network);
void SetCipherWord(APNetwork& network, const std::string& word);

// "bgn" ...: the protocols of the stations that are let in.
std::string ModeWord(const WirelessAPConf& conf);
void SetModeWord(APNetwork& network, const std::string& word);

// "2.4" or "5", GHz. Another band keeps what it can of the mode.
std::string BandWord(const WirelessAPConf& conf);
void SetBandWord(APNetwork& network, const std::string& word);

}  // namespace taviwireless::cli

#endif
