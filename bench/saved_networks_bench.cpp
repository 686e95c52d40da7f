// SPDX-License-Identifier: MIT
// What saved networks cost: listing N of them by the time of use, saving one that is there and one
// more, and beside it how long the real wpa_supplicant takes to read a file of as many. That one
// includes the start of the process, for which "SupplicantReads/0" stands alone; its keys are given
// in the form that needs no derivation. The files are in memory, so waiting for a disk is not in
// the figures.
#include <benchmark/benchmark.h>
#include <taviwireless/wireless.h>

#include <cstdio>
#include <string>

#include "platform/appliance_root/appliance_root.h"
#include "tests/support/files.h"
#include "wireless/rules/paths.h"
#include "wireless/system/queue.h"

namespace {

using namespace taviwireless;
using wireless::kSavedNetworks;

constexpr char kSupplicantFile[] = "/tmp/supplicant.conf";

WirelessConf MakeConf(int number) {
    WirelessConf conf{};
    snprintf(conf.network.essid, sizeof conf.network.essid, "Network %d", number);
    snprintf(conf.key, sizeof conf.key, "pass phrase of %d", number);
    snprintf(conf.ipAddr, sizeof conf.ipAddr, "DHCP");
    conf.network.bssid[0] = 2;
    conf.network.bssid[4] = static_cast<unsigned char>(number >> 8);
    conf.network.bssid[5] = static_cast<unsigned char>(number);
    conf.network.opmode = WIRELESS_OPMODE_MANAGED;
    conf.network.auth = WIRELESS_AUTH_WPA2_PSK;
    conf.network.encrypt = WIRELESS_ENCRYPT_AES;
    return conf;
}

// A file as TAVIWirelessConfSet writes it, with times of use in no order.
std::string SavedNetworks(int64_t count) {
    std::string text;
    unsigned time = 1;
    for (int i = 0; i < count; ++i) {
        const WirelessConf conf = MakeConf(i);
        char bssid[18];
        TAVIWirelessBssidStringGet(conf.network.bssid, bssid, sizeof bssid);
        time = time * 1103515245 + 12345;
        text += std::string("[") + bssid + "]\n\tKEY=" + conf.key +
                "\n\tIPADDR=DHCP\n\tNETMASK=\n\tGATEWAY=\n\tESSID=" + conf.network.essid +
                "\n\tBSSID=" + bssid +
                "\n\tMODE=Managed\n\tACCESS_TIME=" + std::to_string(time >> 1) +
                "\n\tAUTH=WPA2PSK\n\tENCRYPT=AES\n";
    }
    return text;
}

void EnumByAtime(benchmark::State& state) {
    test::WriteFile(kSavedNetworks, SavedNetworks(state.range(0)));
    for (auto _ : state) {
        wireless::OwnedList<WirelessConf> confs;
        const int result = TAVIWirelessConfEnumByAtime(confs.Head());
        int64_t count = 0;
        for (const WirelessConf& conf : confs) {
            count += conf.network.auth == WIRELESS_AUTH_WPA2_PSK ? 1 : 0;
        }
        if (result != 0 || count != state.range(0)) {
            state.SkipWithError("wrong list");
            return;
        }
    }
}

// Saves the network of this number over and over, each time into a file of N others.
void Save(benchmark::State& state, int64_t number) {
    const std::string text = SavedNetworks(state.range(0));
    const WirelessConf conf = MakeConf(static_cast<int>(number));
    for (auto _ : state) {
        state.PauseTiming();
        test::WriteFile(kSavedNetworks, text);
        state.ResumeTiming();
        if (TAVIWirelessConfSet(&conf) != 0) {
            state.SkipWithError("not saved");
            return;
        }
    }
}

void SaveAgain(benchmark::State& state) {
    Save(state, state.range(0) / 2);
}

void SaveOneMore(benchmark::State& state) {
    Save(state, state.range(0));
}

void SupplicantReads(benchmark::State& state) {
    std::string text;
    for (int i = 0; i < state.range(0); ++i) {
        text += "network={\n\tssid=\"Network " + std::to_string(i) +
                "\"\n\tscan_ssid=1\n\tkey_mgmt=WPA-PSK\n\tpairwise=CCMP\n\tpsk=" +
                std::string(64, 'a') + "\n}\n";
    }
    test::WriteFile(kSupplicantFile, text);
    const std::string command =
        std::string("/sbin/wpa_supplicant -c ") + kSupplicantFile + " -i nosuch -D wired 2>&1";
    for (auto _ : state) {
        FILE* pipe = popen(command.c_str(), "r");
        std::string said;
        for (int c; (c = fgetc(pipe)) != EOF;) {
            said += static_cast<char>(c);
        }
        pclose(pipe);
        if (said.find("Line ") != said.npos || said.find("No such device") == said.npos) {
            state.SkipWithError("the file was not read");
            return;
        }
    }
}

void Counts(benchmark::internal::Benchmark* run) {
    run->ArgsProduct({{10, 100, 1000, 10000}})->Unit(benchmark::kMillisecond)->UseRealTime();
}

BENCHMARK(EnumByAtime)->Apply(Counts);
BENCHMARK(SaveAgain)->Apply(Counts);
BENCHMARK(SaveOneMore)->Apply(Counts);
BENCHMARK(SupplicantReads)->Arg(0)->Apply(Counts);

}  // namespace

int main(int argc, char** argv) {
    EnterApplianceRoot();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
}
