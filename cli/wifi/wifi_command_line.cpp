// SPDX-License-Identifier: MIT
// taviwireless wifi: the commands, what they are called and what they take.
#include "cli/adapter/credentials.h"
#include "cli/command_lines.h"
#include "cli/wifi/wifi_commands.h"

namespace taviwireless::cli {

namespace {

void AddWifiConnectCommand(const Command& wifi, Options& options) {
    const Command connect = AddSelfTimed(
        wifi, "connect",
        "Join a network, and save it; its key is read from standard input unless saved", options,
        ConnectWifi);
    connect
        .AddOption("NETWORK", options.network,
                   "Its name (SSID), or the BSSID of the one access point to join")
        .Required();
    connect.AddOption("--user", options.user, "User, where a network wants one");
    connect.AddFlag("--new-key", options.newKey, "Ask for the key although one is saved");
    const Argument isStatic = connect.AddOption(
        "--static", options.staticAddress,
        "This address instead of one by DHCP, and the default gateway", "ADDRESS/PREFIX[,GATEWAY]");
    connect.AddOption("--dns", options.nameServers, "Name servers that go with a static address",
                      "ADDRESS[,ADDRESS]");
    connect.AddFlag("--dhcp", options.dhcp, "DHCP although a static address is saved")
        .Excludes(isStatic);
    const Argument isHidden =
        connect.AddFlag("--hidden", options.hidden, "The network does not show in a scan");
    connect.AddOption("--security", options.security, "What a hidden network wants")
        .Needs(isHidden)
        .OneOf(SecurityWords());
}

constexpr char kSavedName[] = "Its name (SSID), or the BSSID of its access point";

void AddSavedNetworkCommands(const Command& wifi, Options& options) {
    const Command saved = wifi.AddGroup("saved", "The networks that were joined before");
    Add(saved, "list", "List them, the last used first", options, ListSavedNetworks);
    const Command show = Add(saved, "show", "Show one of them", options, ShowSavedNetwork);
    show.AddOption("NETWORK", options.network, kSavedName).Required();
    show.AddFlag("--show-secrets", options.showSecrets, "Show the key as well");
    const Command edit =
        Add(saved, "edit", "Change what is saved of one of them", options, EditSavedNetwork);
    edit.AddOption("NETWORK", options.network, kSavedName).Required();
    edit.AddOption("CHANGE", options.settings,
                   "key (alone: it is read from standard input), user=NAME, dhcp=yes, "
                   "address=ADDRESS/PREFIX, gateway=ADDRESS, dns=ADDRESS[,ADDRESS]; an empty "
                   "gateway or dns takes it away",
                   "KEY=VALUE")
        .Required();
    Add(wifi, "forget", "Remove a saved network (host edition of the SDK alone)", options,
        ForgetNetwork)
        .AddOption("NETWORK", options.network, kSavedName)
        .Required();
}

}  // namespace

void AddWifiCommands(const Command& app, Options& options) {
    const Command wifi = app.AddGroup("wifi", "The Wi-Fi adapter");
    Add(wifi, "status", "Show the state of the adapter and its connection", options, ShowWifi);
    Add(wifi, "watch", "Show the state and the signal as they change, until Ctrl-C", options,
        WatchWifi);
    Add(wifi, "scan", "List the networks in range", options, ListNetworks)
        .AddFlag("--channels", options.channels, "Draw who is on which channel");
    AddWifiConnectCommand(wifi, options);
    Add(wifi, "disconnect", "End the connection", options, DisconnectWifi);
    AddSelfTimed(wifi, "auto", "Join the saved network that was used last and is in range", options,
                 ConnectAutomatically);
    AddSavedNetworkCommands(wifi, options);

    Add(wifi, "qr", "Show the QR code by which a telephone joins; it holds the key", options,
        ShowSavedCode)
        .AddOption("NETWORK", options.network, "A saved network: its name, or BSSID")
        .Required();

    const Command adhoc =
        AddSelfTimed(wifi, "adhoc", "Create or join an ad-hoc network", options, CreateAdhoc);
    adhoc.AddOption("SSID", options.network, "Name of the network").Required();
    adhoc.AddFlag("--wep", options.wep, "With a WEP key, which is read from standard input");

    Add(wifi, "mode", "Make the adapter an access point or a client", options, ChangeWifiMode)
        .AddOption("MODE", options.mode, "ap or client")
        .Required()
        .OneOf({"ap", "client"});
    Add(wifi, "radio", "Switch the radio of the adapter on or off", options, SwitchRadio)
        .AddOption("STATE", options.mode, "on or off")
        .Required()
        .OneOf({"on", "off"});
    Add(wifi, "gateway", "Show the gateway that the connection should use", options,
        ShowWifiGateway);
}

}  // namespace taviwireless::cli
