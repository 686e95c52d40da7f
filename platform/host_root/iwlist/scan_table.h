// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_IWLIST_SCAN_TABLE_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_IWLIST_SCAN_TABLE_H

#include <array>
#include <optional>
#include <string>

// The table of networks that "iwlist INTERFACE scanning tavi" prints.
namespace taviwireless::iwlist {

// A network as the kernel describes it.
struct ScanResult {
    std::array<unsigned char, 6> bssid{};
    int frequency = 0;             // MHz
    std::optional<int> signalDbm;  // most drivers
    int signalPercent = 0;         // the others
    bool isPrivate = false;        // its packets are encrypted in some way
    std::string elements;          // information elements
};

// 0 when there is no channel at this frequency (MHz).
int ChannelOf(int frequency);

// The two lines above the networks.
std::string TableHeading();

// A network's line:
//   columns 0 to 4: the channel
//   columns 5 to 36, counted in bytes: the ESSID; bytes that would break the table are "?"
//   from column 38, with a blank between them: the BSSID; the signal in percent, by the scale that
//     "Link Quality" of the stock tool has (-110 dBm is 0, -40 dBm is 100); the protocols; the
//     protection: NONE, WEP, or authentication and encryption with a slash between them
// The words are those that TAVIWirelessProtocolParse, TAVIWirelessAuthParse and
// TAVIWirelessEncryptParse know. Newer protocols are named by what they build on (11b/g/n, 11a/n);
// WPA3 and other protection that the library cannot join is UNKNOW.
std::string TableLine(const ScanResult& network);

}  // namespace taviwireless::iwlist

#endif
