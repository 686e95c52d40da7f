// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_SECTION_STORE_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_SECTION_STORE_H

#include "common/sz_hash.h"

// The stores of saved networks and of access points: files of sections, which hold keys. file and
// line are those of the log lines.
namespace taviwireless::wireless {

// Of a store, or of a section in it.
enum class Found { kFailed, kNew, kExisting };

// Creates a store that is missing, not readable for others before the first key is in it. An
// existing one keeps its mode.
Found FindStore(const char* store, const char* file, int line);

// Adds the section, or replaces it.
bool SaveSection(const char* store, Found found, const char* section, const SzHash& values,
                 const char* file, int line);

}  // namespace taviwireless::wireless

#endif
