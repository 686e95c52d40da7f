#ifndef TAVIWIRELESS_CLI_WIFI_STATION_H
#define TAVIWIRELESS_CLI_WIFI_STATION_H

#include <taviwireless/wireless.h>

#include <string>
#include <vector>

#include "cli/command_line.h"

namespace taviwireless::cli {

// The library's Wi-Fi functions with texts, vectors and exceptions. Failures throw CommandError.

std::string WifiInterface();

void RequireWifiSupport();
// Root, and a model that supports Wi-Fi.
void RequireWifiSettings();
// The same, and an adapter that is plugged in.
void RequireAdapter();
// A radio that may be used: with another, the library's functions succeed and do nothing.
void RequireRadio();

// An ESSID that can be joined or created.
void CheckEssid(const std::string& essid);

CommandError ScanError();
// The networks in range, the best signal first; takes some seconds.
std::vector<WirelessNetwork> Scan();

// The last used first.
std::vector<WirelessConf> SavedNetworks();

// True in a network, be it that of an access point or an ad-hoc one.
bool IsInNetwork(int status);
WirelessStatus LookAtWifi();
// The IPv4 address of the interface; empty without one.
std::string WifiAddress();
// False when there is no default route after it either.
bool SetDefaultGateway(const char* gateway);
// The gateway that the connection should use; empty when none is known.
std::string ConnectionGateway();
// Makes the gateway of the lease the default one, unless another interface is connected, whose
// route stays. False when that failed.
bool UseLeasedGateway();

void EndConnection();
// The same unless there is none. A connection cannot replace another without a trace of the old.
void LeaveNetwork();

// Sets a text of a record; what does not fit is cut off.
template <size_t Size>
void SetField(char (&field)[Size], const std::string& text) {
    field[text.copy(field, Size - 1)] = '\0';
}

}  // namespace taviwireless::cli

#endif
