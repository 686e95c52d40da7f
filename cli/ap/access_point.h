// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_AP_ACCESS_POINT_H
#define TAVIWIRELESS_CLI_AP_ACCESS_POINT_H

#include <taviwireless/wireless.h>

#include <optional>
#include <string>
#include <vector>

namespace taviwireless::cli {

// The library's functions of the access point with exceptions. Failures throw CommandError.

// What everybody may know; nothing where the settings cannot be told.
struct APStatus {
    bool isSupported;
    bool isConnecting;
    bool isOn;                                   // the adapter works as one
    std::optional<WirelessAPSettings> settings;  // only root may read them
    std::string bridgeAddress;
};
APStatus LookAtAP();

// The settings of the adapter that is plugged in: those stored, or the defaults where none are.
WirelessAPSettings ReadAPSettings();
// Whether they are stored, and not defaults.
bool AreStored(const WirelessAPSettings& settings);
// Stores them whether they say that the access point is on or off.
void StoreAPSettings(WirelessAPSettings settings);

// Stores, where nothing is stored, that an open network is wanted. Throws when another one is.
void StoreOpenNetwork();

struct Switched {
    bool wasOn;          // with these settings; nothing was done
    std::string remark;  // on what could not be done; mostly empty
};
// Stores that the access point is on, and switches it on: with stored settings only, never with
// defaults, which are those of an open network. When that fails and it was stored as off, it is
// switched off and stored as off again. Settings that were changed are stored in the same step.
Switched SwitchAPOn(const std::optional<WirelessAPSettings>& changed = std::nullopt);
// What switching it on would do to the network of the machine, in lines; does none of it.
std::vector<std::string> PlanAP();
// Switches it off, and stores that. False when it was off already.
bool SwitchAPOff();

}  // namespace taviwireless::cli

#endif
