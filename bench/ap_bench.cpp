// SPDX-License-Identifier: MIT
// What the access point's files cost: writing hostapd's, and reading and saving the settings of one
// product where N are stored. Writing and saving run tools (ps, mkdir, grep), which "Tools" runs
// alone for comparison. The files are in memory, so waiting for a disk is not in the figures.
#include <benchmark/benchmark.h>
#include <taviwireless/wireless.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "platform/appliance_root/appliance_root.h"
#include "tests/support/files.h"
#include "wireless/rules/hostapd_conf.h"

namespace {

using namespace taviwireless;

constexpr char kSettings[] = "/usr/tavi/etc/wireless_ap.conf";

WirelessAPSettings MakeSettings(int64_t number) {
    WirelessAPSettings settings;
    TAVIWirelessGetAPConfig(("Product " + std::to_string(number)).c_str(), &settings);
    settings.enabled = 1;
    settings.ap.security = settings.ap.guestSecurity = WIRELESS_AP_WPA;
    settings.ap.secret = {};
    settings.ap.secret.wpa.wpaVersion = 2;
    settings.ap.secret.wpa.cipher = WIRELESS_AP_CCMP;
    snprintf(settings.ap.secret.wpa.passphrase, WIRELESS_AP_PASSPHRASE_SIZE, "a pass phrase");
    settings.ap.guestSecret = settings.ap.secret;
    snprintf(settings.ap.guestSsid, WIRELESS_AP_SSID_SIZE, "Guests");
    return settings;
}

void StoreProducts(int64_t count) {
    test::WriteFile(kSettings, "");
    for (int64_t i = 0; i < count; ++i) {
        const WirelessAPSettings settings = MakeSettings(i);
        TAVIWirelessSetAPConfig(&settings);
    }
}

void RenderHostapdFiles(benchmark::State& state) {
    const WirelessAPSettings settings = MakeSettings(0);
    for (auto _ : state) {
        benchmark::DoNotOptimize(wireless::RenderHostConf("wlan0", settings.ap));
        benchmark::DoNotOptimize(wireless::RenderGuestConf(settings.ap));
    }
}

void WriteHostapdFiles(benchmark::State& state) {
    test::WriteFile("/etc.defaults/taviinfo.conf", "support_pci_wifi=yes\n");
    const WirelessAPSettings settings = MakeSettings(0);
    for (auto _ : state) {
        if (TAVIWirelessSetHostAPConf("wlan0", &settings.ap) != 1) {
            state.SkipWithError("not written");
            return;
        }
    }
}

void Tools(benchmark::State& state) {
    constexpr const char* kCommands[] = {
        "ps | grep hostapd | grep wlan0 | awk {'print $1'} > /dev/null; mkdir -p /etc/hostapd",
        "grep -i \"\\[Product 0\\]\" /usr/tavi/etc/wireless_ap.conf > /dev/null"};
    StoreProducts(1);
    for (auto _ : state) {
        if (system(kCommands[state.range(0)]) != 0) {
            state.SkipWithError("not run");
            return;
        }
    }
}

void ReadSettings(benchmark::State& state) {
    StoreProducts(state.range(0));
    const std::string name = "Product " + std::to_string(state.range(0) / 2);
    for (auto _ : state) {
        WirelessAPSettings settings;
        if (TAVIWirelessGetAPConfig(name.c_str(), &settings) != 1) {
            state.SkipWithError("not read");
            return;
        }
    }
}

void SaveSettings(benchmark::State& state) {
    StoreProducts(state.range(0));
    WirelessAPSettings settings = MakeSettings(state.range(0) / 2);
    for (auto _ : state) {
        ++settings.ap.channel;
        if (TAVIWirelessSetAPConfig(&settings) != 1) {
            state.SkipWithError("not saved");
            return;
        }
    }
}

BENCHMARK(RenderHostapdFiles)->Unit(benchmark::kMicrosecond);
BENCHMARK(WriteHostapdFiles)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(ReadSettings)->Arg(1)->Arg(10)->Arg(100)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(SaveSettings)->Arg(1)->Arg(10)->Arg(100)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(Tools)->DenseRange(0, 1)->Unit(benchmark::kMicrosecond)->UseRealTime();

}  // namespace

int main(int argc, char** argv) {
    EnterApplianceRoot();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
}
