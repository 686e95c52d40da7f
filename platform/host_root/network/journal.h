// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_JOURNAL_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_JOURNAL_H

#include <optional>

#include "platform/host_root/network/state.h"

// What was before a restart that is under way, in a file: one that is killed cannot put it back, so
// the next one does.
namespace taviwireless::network {

struct Journal {
    State now;      // of the interfaces named
    Names names;    // that the restart touches
    Names clients;  // those on which a DHCP client ran
};

// Throws Error when it cannot be written.
void WriteJournal(const Journal& journal);
// Nothing when the last restart came to its end.
std::optional<Journal> ReadJournal();
void RemoveJournal();

}  // namespace taviwireless::network

#endif
