// SPDX-License-Identifier: MIT
// taviwireless wifi: the adapter and its connection.
#include <taviwireless/wireless.h>

#include "base/fixed_field.h"
#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/deadline.h"
#include "cli/interrupt.h"
#include "cli/terminal.h"
#include "cli/wifi/channels.h"
#include "cli/wifi/ip_address.h"
#include "cli/wifi/joining.h"
#include "cli/wifi/saved_networks.h"
#include "cli/wifi/station.h"
#include "cli/wifi/supplicant_events.h"
#include "cli/wifi/wifi_commands.h"
#include "cli/wifi/wifi_report.h"
#include "wireless/rules/paths.h"

namespace taviwireless::cli {

namespace {

// The tool that creates an ad-hoc network is given one word each.
void CheckOneWord(const std::string& text, const char* what) {
    if (text.find_first_of(" \t") != std::string::npos) {
        throw CommandError(kUsage,
                           std::string(what) + " of an ad-hoc network may not hold a blank");
    }
}

// Those of a network with a static address, of which the library knows nothing.
void UseSavedNameServers() {
    const std::vector<WirelessConf> all = SavedNetworks();
    const WirelessConf* saved = FindSaved(all, LookAtWifi().network);
    if (saved != nullptr && !IsDHCP(*saved) && !SetNameServers(SavedNameServers(*saved))) {
        throw CommandError(kFailure, std::string("connected, but could not set the name servers "
                                                 "in ") +
                                         wireless::kResolver);
    }
}

}  // namespace

// Needs no root and no adapter: that there is none is an answer here.
void ShowWifi(const Options& options) {
    Print(options, DescribeConnection());
}

void ListNetworks(const Options& options) {
    RequireAdapter();
    RequireScanner();
    ShowProgress("Looking for networks ...");
    const std::vector<NetworkInRange> networks = Deadline(options).Limit(Scan);
    Print(options, options.channels ? DescribeChannels(networks) : DescribeAll(networks));
}

// Disconnects also when the adapter was unplugged: the connection has then left its address and its
// resolver file behind.
void DisconnectWifi(const Options& options) {
    RequireWifiSettings();
    ShowProgress("Disconnecting ...");
    EndConnection();
    PrintConnection(options);
}

void ConnectAutomatically(const Options& options) {
    RequireAdapter();
    RequireRadio();
    RequireScanner();
    RequireSupplicant();
    RequireNobodyJoins();
    // The library would end the connection that exists.
    if (IsInNetwork(TAVIWirelessConnStatusGet())) {
        PrintConnection(options);
        return;
    }
    if (SavedNetworks().empty()) {
        throw CommandError(kNotFound, "no network is saved; taviwireless wifi connect saves one");
    }
    ShowProgress("Joining a saved network ...");
    const FormerConnection none;
    const UndoneBySignal guard([&](const auto& why) { none.Undo(options, why); }, options.timeout);
    SupplicantEvents events;
    // The library reports success, too, when it cannot tell whether the radio may be used.
    if (TAVIWirelessAutoConnect() != 0 || !IsInNetwork(TAVIWirelessConnStatusGet())) {
        const std::string reason = events.WhyNotJoined();
        throw CommandError(kFailure,
                           "none of the saved networks could be joined; " +
                               (reason.empty() ? "is one in range, and its key still right?"
                                               : "of one of them, " + reason));
    }
    if (!UseLeasedGateway()) {
        throw CommandError(kFailure, "connected, but could not make " + ConnectionGateway() +
                                         " the default gateway: no route leads to it");
    }
    UseSavedNameServers();
    PrintConnection(options);
}

void CreateAdhoc(const Options& options) {
    CheckEssid(options.network);
    CheckOneWord(options.network, "the name");
    RequireAdapter();
    RequireRadio();
    WirelessConf conf{};
    CopyField(conf.network.essid, options.network);
    conf.network.opmode = WIRELESS_OPMODE_ADHOC;
    SetSecurity(conf.network, options.wep ? "wep" : "open");
    if (options.wep) {
        const std::string key = ReadKey(Security::kWEP, options.network);
        CheckOneWord(key, "the key");
        CopyField(conf.key, key);
    }
    FormerConnection former;
    const UndoneBySignal guard([&](const auto& why) { former.Undo(options, why); },
                               options.timeout);
    LeaveNetwork();
    ShowProgress("Creating " + Printable(options.network) + " ...");
    if (TAVIWirelessAdhocCreate(&conf) != 0) {
        throw CommandError(kFailure,
                           "cannot create the ad-hoc network " + Printable(options.network) +
                               ": the adapter may know no such networks" + former.ComeBack());
    }
    PrintConnection(options);
}

void ChangeWifiMode(const Options& options) {
    constexpr int kAccessPoint = 0;
    constexpr int kClient = 1;
    RequireWifiSettings();
    ShowProgress("Changing the mode ...");
    if (TAVIWirelessModeChange(options.mode == "ap" ? kAccessPoint : kClient) == 0) {
        throw CommandError(kFailure, std::string("the mode of the adapter could not be changed: ") +
                                         wireless::kHotplugScript + " failed or is not there");
    }
    PrintConnection(options);
}

void ShowWifiGateway(const Options& options) {
    RequireWifiSettings();
    const std::string gateway = ConnectionGateway();
    if (gateway.empty()) {
        throw CommandError(kFailure, "no gateway is known for " + WifiInterface() +
                                         ": it is not connected, or its network has none");
    }
    Report report{{{Printable(gateway)}}, {}};
    report.document["gateway"] = gateway;
    Print(options, report);
}

}  // namespace taviwireless::cli
