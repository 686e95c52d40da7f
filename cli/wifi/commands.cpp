// taviwireless wifi: the Wi-Fi adapter.
#include "cli/commands.h"

#include <json/json.h>
#include <taviwireless/wireless.h>

#include <CLI/CLI.hpp>
#include <iostream>

#include "cli/wifi/access.h"
#include "cli/wifi/output.h"
#include "cli/wifi/settings.h"

namespace taviwireless::cli {

namespace {

// For everybody: that there is no adapter is an answer here.
void Status(const Options& options) {
    const WirelessStatus status = LookAtWifi();
    const std::string address = WifiAddress();
    options.json ? Print(ToJson(status, address)) : Print(StatusTable(status, address));
}

void ShowScan(const Options& options) {
    RequireAdapter();
    ShowProgress("Looking for networks ...");
    const auto networks = Scan();
    if (options.json) {
        Print(ToJson(networks));
    } else {
        ShowProgress("");
        std::cout << ListText(networks);
    }
}

// With the adapter unplugged, the connection has left its address and its resolver file behind.
void Disconnect(const Options& options) {
    RequireWifiSettings();
    const WirelessStatus status = LookAtWifi();
    if (!IsInNetwork(status.status) && status.status != WIRELESS_STATUS_NO_ADAPTER) {
        throw CommandError(kFailure, WifiInterface() + " is not connected");
    }
    ShowProgress("Disconnecting ...");
    EndConnection();
    ReportWifi(options);
}

void ConnectAutomatically(const Options& options) {
    RequireAdapter();
    RequireRadio();
    // It would end the connection that exists.
    if (IsInNetwork(TAVIWirelessConnStatusGet())) {
        throw CommandError(kBusy, WifiInterface() +
                                      " has a connection already; taviwireless wifi disconnect "
                                      "ends it");
    }
    if (SavedNetworks().empty()) {
        throw CommandError(kNotFound, "no network is saved; taviwireless wifi connect saves one");
    }
    ShowProgress("Joining a saved network ...");
    if (TAVIWirelessAutoConnect() != 0) {
        throw CommandError(kFailure,
                           "none of the saved networks could be joined; is one in range, and its "
                           "key still right?");
    }
    if (!UseLeasedGateway()) {
        throw CommandError(kFailure, "connected, but could not make " + ConnectionGateway() +
                                         " the default gateway; the system log tells why");
    }
    ReportWifi(options);
}

// The tool that creates an ad-hoc network is given one word each.
void CheckOneWord(const std::string& text, const char* what) {
    if (text.find_first_of(" \t") != std::string::npos) {
        throw CommandError(kUsage,
                           std::string(what) + " of an ad-hoc network may not hold a blank");
    }
}

void CreateAdhoc(const Options& options) {
    CheckEssid(options.network);
    CheckOneWord(options.network, "the name");
    RequireAdapter();
    RequireRadio();
    WirelessConf conf{};
    SetField(conf.network.essid, options.network);
    conf.network.opmode = WIRELESS_OPMODE_ADHOC;
    SetSecurity(conf.network, options.wep ? "wep" : "open");
    if (options.wep) {
        const std::string key = ReadKey(Security::kWEP, options.network);
        CheckOneWord(key, "the key");
        SetField(conf.key, key);
    }
    LeaveNetwork();
    ShowProgress("Creating " + Printable(options.network) + " ...");
    if (TAVIWirelessAdhocCreate(&conf) != 0) {
        throw CommandError(kFailure, "cannot create the ad-hoc network " +
                                         Printable(options.network) + "; the system log tells why");
    }
    ReportWifi(options);
}

void ChangeMode(const Options& options) {
    constexpr int kAccessPoint = 0;
    constexpr int kClient = 1;
    RequireWifiSettings();
    ShowProgress("Changing the mode ...");
    if (TAVIWirelessModeChange(options.mode == "ap" ? kAccessPoint : kClient) == 0) {
        throw CommandError(kFailure,
                           "the mode of the adapter could not be changed: "
                           "/usr/tavi/hotplug/usb.wireless.function failed or is not there");
    }
    ReportWifi(options);
}

void ShowGateway(const Options& options) {
    RequireWifiSettings();
    const std::string gateway = ConnectionGateway();
    if (gateway.empty()) {
        throw CommandError(kFailure, "no gateway is known for " + WifiInterface() +
                                         ": it is not connected, or its network has none");
    }
    Json::Value document;
    document["gateway"] = gateway;
    options.json ? Print(document) : Print(Table{{Printable(gateway)}});
}

}  // namespace

void AddWifiCommands(CLI::App& app, Options& options) {
    CLI::App* wifi = app.add_subcommand("wifi", "The Wi-Fi adapter");
    wifi->require_subcommand(1);
    wifi->fallthrough();
    const auto add = [&](const char* name, const char* description, void (*run)(const Options&)) {
        CLI::App* command = wifi->add_subcommand(name, description);
        command->callback([&options, run] { run(options); });
        return command;
    };

    add("status", "Show the state of the adapter and its connection", Status);
    add("scan", "List the networks in range", ShowScan);
    AddWifiConnectCommand(*wifi, options);
    add("disconnect", "End the connection", Disconnect);
    add("auto", "Join the saved network that was used last and is in range", ConnectAutomatically);
    AddWifiSavedCommands(*wifi, options);

    CLI::App* adhoc = add("adhoc", "Create or join an ad-hoc network", CreateAdhoc);
    adhoc->add_option("SSID", options.network, "Name of the network")->required();
    adhoc->add_flag("--wep", options.wep, "With a WEP key, which is read from standard input");

    add("mode", "Make the adapter an access point or a client", ChangeMode)
        ->add_option("MODE", options.mode, "ap or client")
        ->required()
        ->check(CLI::IsMember({"ap", "client"}));
    add("gateway", "Show the gateway that the connection should use", ShowGateway);
}

}  // namespace taviwireless::cli
