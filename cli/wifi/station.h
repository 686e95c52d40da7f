// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_STATION_H
#define TAVIWIRELESS_CLI_WIFI_STATION_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

#include "cli/command_error.h"

namespace taviwireless::cli {

// The adapter as a station: the library's functions with texts, vectors and exceptions. Failures
// throw CommandError.

CommandError ScanError();

// A network in range, and what it is to this machine.
struct NetworkInRange {
    WirelessNetwork network{};  // without a name: one that hides it
    std::string newerSecurity;  // see RawNetwork
    bool isInUse = false;
    bool isSaved = false;
};
// The networks in range, the best signal first; takes some seconds.
std::vector<NetworkInRange> Scan();
// Protection newer than WPA2 that the network was seen with; empty when that is not known.
std::string NewerSecurityOf(const WirelessNetwork& network);

// True in a network, be it that of an access point or an ad-hoc one.
bool IsInNetwork(int status);
WirelessStatus LookAtWifi();
// The IPv4 address of the interface; empty without one.
std::string WifiAddress();
// Sets the default route. False when there is none afterwards.
bool SetDefaultGateway(const char* gateway);
// The gateway of the default route through the interface; empty when there is none.
std::string GatewayInForce();
// "ADDRESS,ADDRESS"; empty when there are none.
std::string NameServersInForce();
// Makes these the name servers until the connection ends; none: leaves those that are. False when
// that failed.
bool SetNameServers(const std::string& nameServers);
// The gateway that the connection should use; empty when none is known.
std::string ConnectionGateway();
// Makes the gateway of the lease the default one, unless another interface is connected, whose
// route stays. False when that failed.
bool UseLeasedGateway();

void EndConnection();
// Ends the connection if there is one. To be called before another network is joined, or traces of
// the old connection would stay.
void LeaveNetwork();
// Takes away what an attempt to join has left that was cut off anywhere.
void CleanUpAttempt();

}  // namespace taviwireless::cli

#endif
