// SPDX-License-Identifier: MIT
// What the access point costs: writing hostapd's files, reading and saving the settings of one product
// where N are stored, switching it on and off, and telling N stations. Writing and saving run tools
// (ps, mkdir, grep), which "Tools" runs alone for comparison; what is left of writing, in time of the
// processor, is "WriteHostapdFilesOwn". Switching on has a stand-in for hostapd, since there is no
// radio, and the real DHCP server. The files are in memory, so waiting for a disk is in no figure.
#include <benchmark/benchmark.h>
#include <tavicore/process.h>
#include <taviwireless/wireless.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "bench/own_time.h"
#include "platform/appliance_root/appliance_root.h"
#include "tests/platform/host_root/root_scripts.h"
#include "tests/wireless/wifi_fixture.h"
#include "wireless/rules/hostapd_conf.h"
#include "wireless/system/shell.h"

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

// One is stored, and the others are copies of its section.
void StoreProducts(int64_t count) {
    test::WriteFile(kSettings, "");
    const WirelessAPSettings settings = MakeSettings(0);
    TAVIWirelessSetAPConfig(&settings);
    const std::string section = test::ReadFile(kSettings).substr(std::string("[Product 0]").size());
    std::string text;
    for (int64_t i = 0; i < count; ++i) {
        text += "[Product " + std::to_string(i) + "]" + section;
    }
    test::WriteFile(kSettings, text);
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

// The programs that writing runs, by the same means.
bool RunTools() {
    constexpr size_t kCommandSize = 1024;
    wireless::Pipe pids(
        wireless::Command(kCommandSize, {"ps | grep hostapd | grep wlan0 | awk {'print $1'}"}));
    int pid = 0;
    return pids && fscanf(pids.get(), " %d", &pid) <= 1 && pids.Close() == 0 &&
           VEXACExec("/bin/mkdir", "-p", "/etc/hostapd", nullptr) == 0;
}

void WriteHostapdFilesOwn(benchmark::State& state) {
    const WirelessAPSettings settings = MakeSettings(0);
    bench::MeasureOwnPart(state, RunTools,
                          [&] { return TAVIWirelessSetHostAPConf("wlan0", &settings.ap) == 1; });
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

// A machine that is ready to be an access point: all was on once, and is off now.
class AccessPoint {
  public:
    AccessPoint() {
        test::WriteFile("/etc.defaults/taviinfo.conf", "support_wireless=yes\n");
        test::WriteFile("/tmp/wireless.info", "PRODUCT=stick\nAP_SUPPORT=yes\n");
        test::Shell("rm -rf /usr/tavi/etc /etc/hostapd; mkdir -p /usr/tavi/etc /etc/dhcpd");
        test::InstallRootScripts();
        test::InstallScript(TAVI_SOURCE_DIR "/platform/appliance_root/hostapd",
                            "/usr/sbin/hostapd");
        tools_.Add("/sbin/iwlist", "echo 1");
        Run({"set", "ssid=My Home", "security=wpa2", "key"}, "correct horse\n");
        Run({"enable"});
        Run({"disable"});
    }

    static bool Run(std::vector<std::string> arguments, const std::string& input = "") {
        arguments.insert(arguments.begin(), {test::BuiltProgram("taviwireless"), "ap"});
        return test::RunProgram(arguments, input).status == 0;
    }

  private:
    test::ToolStandIns tools_;
    test::WirelessInterface interface_;
};

// One of the two is timed, `what`.
void Switch(benchmark::State& state, const std::string& what) {
    const AccessPoint accessPoint;
    for (auto _ : state) {
        for (const std::string step : {"enable", "disable"}) {
            const auto begin = std::chrono::steady_clock::now();
            if (!AccessPoint::Run({step})) {
                state.SkipWithError("not switched");
                return;
            }
            if (step == what) {
                const std::chrono::duration<double> time = std::chrono::steady_clock::now() - begin;
                state.SetIterationTime(time.count());
            }
        }
    }
}

void Enable(benchmark::State& state) {
    Switch(state, "enable");
}

void Disable(benchmark::State& state) {
    Switch(state, "disable");
}

// hostapd and the DHCP server's file know so many stations.
void ListStations(benchmark::State& state) {
    const AccessPoint accessPoint;
    std::string stations, leases(8, '\0');
    for (int64_t i = 0; i < state.range(0); ++i) {
        char mac[18];
        snprintf(mac, sizeof mac, "02:00:00:00:00:%02x", static_cast<unsigned char>(i));
        stations += std::string(mac) + "\nflags=[AUTH][ASSOC][AUTHORIZED]\nrx_bytes=10\n" +
                    "tx_bytes=10\nsignal=-60\nconnected_time=100\n";
        const char last = static_cast<char>(i);
        leases += std::string("\xFF\xFF\xFF\xFF\x0A\x01\x0E", 7) + last +
                  std::string("\x02\0\0\0\0", 5) + last + "phone" + std::string(17, '\0');
    }
    test::WriteFile("/tmp/stations", stations);
    test::WriteFile("/etc/dhcpd/dhcpd-lbr0-lbr0.leases", leases);
    test::ToolStandIns tools;
    tools.Add("/usr/sbin/hostapd_cli", "[ $5 = all_sta ] && cat /tmp/stations || echo PONG");
    for (auto _ : state) {
        const test::RunResult result =
            test::RunProgram({test::BuiltProgram("taviwireless"), "ap", "stations"});
        const auto lines = std::count(result.out.begin(), result.out.end(), '\n');
        if (result.status != 0 || lines != state.range(0) + 1) {
            state.SkipWithError("not listed");
            return;
        }
    }
}

void Counts(benchmark::internal::Benchmark* run) {
    run->ArgsProduct({{10, 100, 1000, 10000}})->Unit(benchmark::kMillisecond)->UseRealTime();
}

BENCHMARK(RenderHostapdFiles)->Unit(benchmark::kMicrosecond);
BENCHMARK(WriteHostapdFiles)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(WriteHostapdFilesOwn)->Unit(benchmark::kMicrosecond)->UseManualTime()->Iterations(50);
BENCHMARK(ReadSettings)->Apply(Counts);
BENCHMARK(SaveSettings)->Apply(Counts);
BENCHMARK(Tools)->DenseRange(0, 1)->Unit(benchmark::kMicrosecond)->UseRealTime();
BENCHMARK(Enable)->Unit(benchmark::kMillisecond)->UseManualTime()->Iterations(15);
BENCHMARK(Disable)->Unit(benchmark::kMillisecond)->UseManualTime()->Iterations(15);
BENCHMARK(ListStations)
    ->RangeMultiplier(10)
    ->Range(1, 100)
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();

}  // namespace

int main(int argc, char** argv) {
    EnterApplianceRoot();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
}
