// SPDX-License-Identifier: MIT
// What TAVIWirelessNetworkScan costs with 1,000 networks in range. One call runs the listing tool
// twice, since two runs must agree; the tool is a script that prints a file, and the waits for the
// adapter are cut. "ReadTableTwice" is the same without the library: two shells, two tools, the
// lines read and dropped. The difference of the two is the parsing and the records of 2,000 lines,
// and bringing the interface up.
#include <benchmark/benchmark.h>
#include <stdio.h>
#include <taviwireless/wireless.h>

#include "platform/appliance_root/appliance_root.h"
#include "tests/wireless/wifi_fixture.h"
#include "wireless/system/queue.h"

namespace {

using namespace taviwireless;

constexpr int kNetworks = 1000;

void ReadTableTwice(benchmark::State& state) {
    for (auto _ : state) {
        for (int run = 0; run < 2; ++run) {
            FILE* pipe = popen("/sbin/iwlist wlan0 scanning tavi", "r");
            char line[512];
            int lines = 0;
            while (fgets(line, sizeof line, pipe) != nullptr) {
                ++lines;
            }
            pclose(pipe);
            if (lines != kNetworks + 2) {
                state.SkipWithError("wrong table");
                return;
            }
        }
    }
}

void NetworkScan(benchmark::State& state) {
    for (auto _ : state) {
        wireless::OwnedList<WirelessNetwork> networks;
        const int result = TAVIWirelessNetworkScan(0, networks.Head());
        int count = 0;
        for (const WirelessNetwork& network : networks) {
            count += network.auth == WIRELESS_AUTH_WPA2_PSK ? 1 : 0;
        }
        if (result != 0 || count != kNetworks) {
            state.SkipWithError("wrong list");
            return;
        }
    }
}

BENCHMARK(ReadTableTwice)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(NetworkScan)->Unit(benchmark::kMillisecond)->UseRealTime();

}  // namespace

int main(int argc, char** argv) {
    EnterApplianceRoot();
    const test::WirelessInterface adapter;
    test::ToolStandIns tools;
    std::string table;
    for (int i = 0; i < kNetworks; ++i) {
        table += test::ScanLine(i % 13 + 1, "network " + std::to_string(i), "00:11:22:33:44:55",
                                i % 100, "11b/g/n", "WPA2PSK/AES");
    }
    test::AddScanner(tools, {table});
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
}
