// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_RAW_SCAN_H
#define TAVIWIRELESS_CLI_WIFI_RAW_SCAN_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

namespace taviwireless::cli {

// An access point as the stock form of the scanning tool tells it, which knows two things that the
// library's scan does not: networks without a name, and protection newer than WPA2.
struct RawNetwork {
    WirelessNetwork network{};
    std::string newerSecurity;  // "WPA3", "OWE"; empty: what the library has a word for
};

// What the last scan found; looks for nothing itself. Empty when the tool tells nothing.
std::vector<RawNetwork> LastRawScan();

}  // namespace taviwireless::cli

#endif
