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
// The networks in range, the best signal first; takes some seconds.
std::vector<WirelessNetwork> Scan();

// The last used first.
std::vector<WirelessConf> SavedNetworks();
// By its name or BSSID; of several access points with one name, the one that was used last. Throws
// when none is called so.
WirelessConf SavedNetworkCalled(const std::string& name);

// True in a network, be it that of an access point or an ad-hoc one.
bool IsInNetwork(int status);
WirelessStatus LookAtWifi();
// The IPv4 address of the interface; empty without one.
std::string WifiAddress();
// Sets the default route. False when there is none afterwards.
bool SetDefaultGateway(const char* gateway);
// The gateway that the connection should use; empty when none is known.
std::string ConnectionGateway();
// Makes the gateway of the lease the default one, unless another interface is connected, whose
// route stays. False when that failed.
bool UseLeasedGateway();

void EndConnection();
// Ends the connection if there is one. To be called before another network is joined, or traces of
// the old connection would stay.
void LeaveNetwork();

}  // namespace taviwireless::cli

#endif
