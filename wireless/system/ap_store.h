// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_AP_STORE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_AP_STORE_H

#include <taviwireless/wireless.h>

// The settings of access points in their store. file and line are those of the log lines.
namespace taviwireless::wireless {

enum class Found;  // see section_store.h

// Whether "[section]" stands anywhere in the store, in any case; a value that holds it counts as
// well, and then there is no section to replace. Creates a store that is missing.
Found FindAPSection(const char* section, const char* file, int line);

// Puts all settings into their section, found before, in one step; those of an access point that is
// off as well, of which TAVIWirelessSetAPConfig stores nothing but that.
bool SaveAPSettings(const WirelessAPSettings& settings, Found found, const char* file, int line);

}  // namespace taviwireless::wireless

#endif
