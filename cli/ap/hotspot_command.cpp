// SPDX-License-Identifier: MIT
// taviwireless ap hotspot and ap qr: a network that somebody joins by a look at the screen.
#include <fstream>
#include <iostream>

#include "base/fixed_field.h"
#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/ap/access_point.h"
#include "cli/ap/ap_changes.h"
#include "cli/ap/ap_commands.h"
#include "cli/ap/ap_report.h"
#include "cli/ap/channel_choice.h"
#include "cli/ap/setting_words.h"
#include "cli/command_error.h"
#include "cli/qr_code.h"
#include "cli/terminal.h"
#include "wireless/rules/radio.h"

namespace taviwireless::cli {

namespace {

// 64 bits in 16 letters, with a dash after every four. None of the letters is easily taken for
// another one, or for a digit.
std::string NewKey() {
    constexpr char kLetters[] = "acdefhjkmnprtwxy";
    unsigned char random[16];
    // From the file, as kernels before 3.17 have no getrandom().
    std::ifstream source("/dev/urandom", std::ios::binary);
    if (!source.read(reinterpret_cast<char*>(random), sizeof random)) {
        throw CommandError(kFailure, "the kernel gives no random numbers for a key");
    }
    std::string key;
    for (size_t i = 0; i < sizeof random; ++i) {
        key += i > 0 && i % 4 == 0 ? "-" : "";
        key += kLetters[random[i] % 16];
    }
    return key;
}

// WPA2 with AES. A network that is so already keeps its key: stations know it.
void MakeHotspot(WirelessAPConf& conf, const std::string& ssid) {
    APNetwork network = MainNetwork(conf);
    const bool isRenamed = !ssid.empty() && ssid != network.ssid;
    if (isRenamed) {
        CheckEssid(ssid);
        CopyField(network.ssid, ssid);
    }
    if (isRenamed || SecurityWord(network) != "wpa2" || CipherWord(network) != "aes") {
        SetSecurityWord(network, "wpa2");
        SetCipherWord(network, "aes");
        CopyField(network.secret.wpa.passphrase, NewKey());
    }
    CheckAPConf(conf);
}

CodeNetwork CodeOf(const APNetwork& network) {
    switch (network.security) {
        case WIRELESS_AP_WEP:
            return {network.ssid, "WEP", network.secret.wepKey, network.hidden != 0};
        case WIRELESS_AP_WPA:
            return {network.ssid, "WPA", network.secret.wpa.passphrase, network.hidden != 0};
        case WIRELESS_AP_WPA_ENTERPRISE:
            throw CommandError(kFailure,
                               "a network whose users have passwords of their own has no QR code");
        default:
            return {network.ssid, "nopass", "", network.hidden != 0};
    }
}

// What it has come to, the network, and the picture of its code where that fits the terminal.
void PrintForAPerson(const Report& outcome, const Report& network, const CodeNetwork& code) {
    Report picture;
    try {
        for (const std::string& line : DrawCode(WifiText(code))) {
            picture.rows.push_back({line});
        }
    } catch (const CommandError& tooNarrow) {
        picture.rows.push_back({tooNarrow.what()});
    }
    for (const Report* report : {&outcome, &network, static_cast<const Report*>(&picture)}) {
        Print({}, *report);
    }
}

}  // namespace

void ServeHotspot(const Options& options) {
    RequireAPSupport();
    WirelessAPSettings settings = ReadAPSettings();
    MakeHotspot(settings.ap, options.network);
    std::string channel;
    if (settings.ap.channel == wireless::kAnyChannel) {
        channel = TakeEmptiestChannel(settings.ap);
    }
    ShowProgress("Switching the access point on ...");
    const Switched switched = SwitchAPOn(settings);
    const CodeNetwork code = CodeOf(MainNetwork(settings.ap));
    Report outcome = DescribeSwitchedOn(switched, settings.ap);
    Report network;
    if (!channel.empty()) {
        outcome.rows.push_back({channel});
    }
    network.Add("ssid", "Network", code.ssid);
    network.Add("key", "Key", code.key);
    if (!options.json) {
        return PrintForAPerson(outcome, network, code);
    }
    outcome.document["channel_reason"] = TextOrNull(channel);
    outcome.document["key"] = code.key;
    outcome.document["qr_text"] = WifiText(code);
    Print(options, outcome);
}

void ShowAPCode(const Options& options) {
    RequireWifiSettings();
    WirelessAPSettings settings = ReadAPSettings();
    if (!AreStored(settings) || (options.guest && settings.ap.guestEnabled == 0)) {
        throw CommandError(kFailure, options.guest ? "there is no network for guests; set guest=yes"
                                                   : "no settings are stored; taviwireless ap "
                                                     "hotspot makes a network");
    }
    PrintCode(options,
              CodeOf(options.guest ? GuestNetwork(settings.ap) : MainNetwork(settings.ap)));
}

}  // namespace taviwireless::cli
