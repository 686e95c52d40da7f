// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_FUZZ_PLAYED_TOOL_H
#define TAVIWIRELESS_TESTS_FUZZ_PLAYED_TOOL_H

#include <spawn.h>
#include <taviwireless/wireless.h>
#include <unistd.h>

#include <cstdio>
#include <vector>

#include "tests/fuzz/fuzz.h"
#include "wireless/system/queue.h"

// A scan without adapter and tool, for programs that export these names: what the tool prints comes
// from the stream that the library opens for a command's output.
#define TAVI_TAKEN_OVER extern "C" __attribute__((visibility("default")))

inline std::string printedByTheTool;

TAVI_TAKEN_OVER int TAVIWirelessAdapterNum() {
    return 1;
}

TAVI_TAKEN_OVER int VEXANetIfUp(const char*) {
    return 1;
}

TAVI_TAKEN_OVER int posix_spawnp(pid_t* process, const char*, const posix_spawn_file_actions_t*,
                                 const posix_spawnattr_t*, char* const[], char* const[]) {
    *process = getpid();  // no child of this process, so nobody waits for it
    return 0;
}

TAVI_TAKEN_OVER FILE* fopencookie(void*, const char* mode, cookie_io_functions_t) noexcept {
    return fmemopen(printedByTheTool.data(), printedByTheTool.size(), mode);
}

namespace taviwireless::fuzz {

inline std::vector<WirelessNetwork> Scanned(const std::string& table) {
    printedByTheTool = "CH   ESSID\n---\n" + table;
    wireless::OwnedList<WirelessNetwork> networks;
    Demand(TAVIWirelessNetworkScan(0, networks.Head()) == 0, "the table is read", table);
    std::vector<WirelessNetwork> copies;
    for (const WirelessNetwork& network : networks) {
        copies.push_back(network);
    }
    return copies;
}

}  // namespace taviwireless::fuzz

#endif
