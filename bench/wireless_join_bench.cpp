// SPDX-License-Identifier: MIT
// What joining a network costs over the supplicant's own time: this one is associated at once, and the
// tools are stand-ins. The waits in which the adapter and the supplicant do their work are cut: a
// second before a scan and one for the supplicant. "Join" is the library's call, "Connect" the whole
// command, which scans, joins, sets an address and saves.
#include <benchmark/benchmark.h>

#include "platform/appliance_root/appliance_root.h"
#include "tests/wireless/station_fixture.h"

namespace {

using namespace taviwireless;

void Join(benchmark::State& state) {
    test::Station station;
    WirelessConf conf = test::MakeConf();
    for (auto _ : state) {
        if (TAVIWirelessNetworkConnect(&conf) != 0) {
            state.SkipWithError("not joined");
            return;
        }
    }
}

void Connect(benchmark::State& state) {
    test::Station station;
    test::SetSupport("yes");
    test::WriteFile("/tmp/wireless.info", "PRODUCT=stick\n");
    test::WriteFile("/tmp/associated", "");
    test::AddScanner(station.tools, {test::ScanLine(6, "My Net", "00:11:22:33:44:55", 80, "11b/g/n",
                                                    "WPA2PSK/AES")});
    for (auto _ : state) {
        const test::RunResult result =
            test::RunProgram({test::BuiltProgram("taviwireless_with_wifi"), "wifi", "connect",
                              "My Net", "--static", "10.9.1.20/24"},
                             "secret123\n");
        if (result.status != 0) {
            state.SkipWithError(result.err.c_str());
            return;
        }
    }
}

BENCHMARK(Join)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(Connect)->Unit(benchmark::kMillisecond)->UseRealTime();

}  // namespace

int main(int argc, char** argv) {
    EnterApplianceRoot();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
}
