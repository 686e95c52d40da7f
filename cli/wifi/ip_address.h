#ifndef TAVIWIRELESS_CLI_WIFI_IP_ADDRESS_H
#define TAVIWIRELESS_CLI_WIFI_IP_ADDRESS_H

#include <taviwireless/wireless.h>

#include <string>

#include "wireless/rules/dhcp.h"

namespace taviwireless::cli {

using wireless::IsDHCP;

// "ADDRESS/PREFIX" or "ADDRESS/PREFIX,GATEWAY", IPv4.
void SetStaticAddress(WirelessConf& conf, const std::string& text);
void SetDHCP(WirelessConf& conf);

}  // namespace taviwireless::cli

#endif
