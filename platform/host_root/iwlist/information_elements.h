// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_IWLIST_INFORMATION_ELEMENTS_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_IWLIST_INFORMATION_ELEMENTS_H

#include <string>
#include <string_view>

// What a network says of itself in the information elements of its beacons. They come from anybody
// with a radio, so any bytes may stand there; what is cut off or unknown is passed over.
namespace taviwireless::iwlist {

// A set of bits, as in TAVIWirelessEncryptParse's names: what protects the data of one station.
enum Cipher { kNoCipher = 0, kTkip = 4, kAes = 8 };

// How stations prove themselves under WPA or WPA2; a set of bits.
enum KeyManagement { kNoKeyManagement = 0, kPsk = 1, kEap = 2, kWpaNone = 4 };

// What one element says: WPA's, or WPA2's, which is called RSN.
struct Protection {
    bool isOffered = false;
    int ciphers = kNoCipher;
    int keyManagement = kNoKeyManagement;
};

struct InformationElements {
    std::string essid;
    bool hasSlowRates = false;       // of 802.11b: 1, 2, 5.5 and 11 Mbit/s
    bool hasFastRates = false;       // of 802.11a and g
    bool hasHighThroughput = false;  // 802.11n
    Protection wpa;
    Protection rsn;
};

InformationElements ParseInformationElements(std::string_view bytes);

}  // namespace taviwireless::iwlist

#endif
