// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_ADAPTER_REQUIREMENTS_H
#define TAVIWIRELESS_CLI_ADAPTER_REQUIREMENTS_H

#include <string>

namespace taviwireless::cli {

std::string WifiInterface();

// What commands about the Wi-Fi adapter want before they begin.

// Throws unless the user is root, with the command as it should have been called.
void RequireRoot();
void RequireWifiSupport();
// Throws unless the user is root and the model supports Wi-Fi.
void RequireWifiSettings();
// Throws unless RequireWifiSettings passes and an adapter is plugged in.
void RequireAdapter();
// Throws unless the radio may be used: if it may not, the library's functions succeed and do
// nothing.
void RequireRadio();
// Throws unless the programs are there: the library takes one that is missing for one that found
// nothing.
void RequireScanner();
void RequireSupplicant();
// Throws when somebody joins a network, and lets the next one pass: an attempt that was killed
// cannot be told from one that goes on, and the library refuses once as well.
void RequireNobodyJoins();

}  // namespace taviwireless::cli

#endif
