// SPDX-License-Identifier: MIT
// The iwlist of the host root: the forms that only the appliance's tool has, and everything else by
// the stock tool.
//
//   iwlist INTERFACE scanning tavi     the networks in range, as scan_table.h describes them
//   iwlist INTERFACE active_channel    the channels that may be used, one a line
//
// It stands where the stock tool does, so that has to be moved: to "/usr/sbin/iwlist.distrib", as
// dpkg-divert does it.
#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <cstring>
#include <exception>

#include "platform/host_root/iwlist/nl80211.h"

namespace {

using namespace taviwireless::iwlist;

constexpr const char* kStockTools[] = {"/usr/sbin/iwlist.distrib", "/usr/sbin/iwlist"};

void PrintNetworks(const char* interface) {
    WirelessInterface wireless(interface);
    wireless.Scan();
    const auto networks = wireless.Networks();
    fputs(TableHeading().c_str(), stdout);
    for (const ScanResult& network : networks) {
        fputs(TableLine(network).c_str(), stdout);
    }
}

void PrintChannels(const char* interface) {
    for (const int frequency : WirelessInterface(interface).UsableFrequencies()) {
        printf("%d\n", ChannelOf(frequency));
    }
}

bool IsThisProgram(const char* path) {
    struct stat other {};
    struct stat own {};
    return stat(path, &other) == 0 && stat("/proc/self/exe", &own) == 0 &&
           other.st_dev == own.st_dev && other.st_ino == own.st_ino;
}

[[noreturn]] void RunStockTool(char** argv) {
    for (const char* path : kStockTools) {
        if (!IsThisProgram(path)) {
            execv(path, argv);
        }
    }
    throw Error(
        "the stock tool is not at /usr/sbin/iwlist.distrib: install wireless-tools and "
        "move it there");
}

void Run(int argc, char** argv) {
    if (argc == 4 && strcmp(argv[2], "scanning") == 0 && strcmp(argv[3], "tavi") == 0) {
        PrintNetworks(argv[1]);
    } else if (argc == 3 && strcmp(argv[2], "active_channel") == 0) {
        PrintChannels(argv[1]);
    } else {
        RunStockTool(argv);
    }
}

}  // namespace

int main(int argc, char** argv) {
    try {
        Run(argc, argv);
    } catch (const std::exception& error) {
        fprintf(stderr, "iwlist: %s.\n", error.what());
        return 1;
    }
    return fflush(stdout) == 0 ? 0 : 1;
}
