// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_NETWORK_NAME_H
#define TAVIWIRELESS_CLI_WIFI_NETWORK_NAME_H

#include <taviwireless/wireless.h>

#include <string>

namespace taviwireless::cli {

// "00:11:22:33:44:AA"; empty when it is not known.
std::string BssidText(const unsigned char (&bssid)[6]);

// What a network is called on the command line: what has the form of a BSSID is the address of an
// access point, anything else an SSID.
class NetworkName {
  public:
    explicit NetworkName(const std::string& text);

    bool IsBssid() const { return isBssid_; }
    bool IsOf(const WirelessNetwork& network) const;
    // For TAVIWirelessNetworkGet.
    const void* Key() const;
    int KeyKind() const { return isBssid_ ? WIRELESS_KEY_BSSID : WIRELESS_KEY_ESSID; }

  private:
    const std::string text_;
    const bool isBssid_;
    unsigned char bssid_[6] = {};
};

}  // namespace taviwireless::cli

#endif
