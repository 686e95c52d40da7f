// SPDX-License-Identifier: MIT
// What TAVIWirelessNetworkScan costs with 1,000 networks in range. One call runs the listing tool
// twice, since two runs must agree; the tool is a script that prints a file, and the waits for the
// adapter are cut. "ReadTableTwice" is the same without the library: two shells, two tools, the
// lines read and dropped. "TablesToList" is the difference of the two in time of the processor: the
// parsing and the records of 2,000 lines, and bringing the interface up.
#include <benchmark/benchmark.h>
#include <stdio.h>
#include <taviwireless/wireless.h>

#include "bench/own_time.h"
#include "platform/appliance_root/appliance_root.h"
#include "tests/wireless/wifi_fixture.h"
#include "wireless/system/queue.h"

namespace {

using namespace taviwireless;

constexpr int kNetworks = 1000;

bool ReadTable() {
    FILE* pipe = popen("/sbin/iwlist wlan0 scanning tavi", "r");
    char line[512];
    int lines = 0;
    while (fgets(line, sizeof line, pipe) != nullptr) {
        ++lines;
    }
    pclose(pipe);
    return lines == kNetworks + 2;
}

bool ReadTables() {
    return ReadTable() && ReadTable();
}

bool Scan() {
    wireless::OwnedList<WirelessNetwork> networks;
    const int result = TAVIWirelessNetworkScan(0, networks.Head());
    int count = 0;
    for (const WirelessNetwork& network : networks) {
        count += network.auth == WIRELESS_AUTH_WPA2_PSK ? 1 : 0;
    }
    return result == 0 && count == kNetworks;
}

void Run(benchmark::State& state, bool (*run)()) {
    for (auto _ : state) {
        if (!run()) {
            state.SkipWithError("wrong list");
            return;
        }
    }
}

void ReadTableTwice(benchmark::State& state) {
    Run(state, ReadTables);
}

void NetworkScan(benchmark::State& state) {
    Run(state, Scan);
}

void TablesToList(benchmark::State& state) {
    bench::MeasureOwnPart(state, ReadTables, Scan);
}

BENCHMARK(ReadTableTwice)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(NetworkScan)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(TablesToList)->Unit(benchmark::kMillisecond)->UseManualTime()->Iterations(50);

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
