// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_IP_ADDRESS_H
#define TAVIWIRELESS_CLI_WIFI_IP_ADDRESS_H

#include <taviwireless/wireless.h>

#include <string>

#include "wireless/rules/dhcp.h"

namespace taviwireless::cli {

using wireless::IsDHCP;

// Each throws CommandError for a text that is no such thing. IPv4.

// "ADDRESS/PREFIX" or "ADDRESS/PREFIX,GATEWAY".
void SetStaticAddress(WirelessConf& conf, const std::string& text);
// "ADDRESS/PREFIX"; the gateway stays.
void SetOwnAddress(WirelessConf& conf, const std::string& text);
// Empty: none.
void SetGateway(WirelessConf& conf, const std::string& text);
void CheckNameServers(const std::string& text);  // "ADDRESS,ADDRESS", or empty: none

// Throws unless gateway and name servers go with the address: they are static if that is, and the
// gateway is in its network.
void CheckAddress(const WirelessConf& conf, const std::string& nameServers);
void SetDHCP(WirelessConf& conf);

}  // namespace taviwireless::cli

#endif
