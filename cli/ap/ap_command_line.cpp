// SPDX-License-Identifier: MIT
// taviwireless ap: the commands, what they are called and what they take.
#include "cli/ap/ap_changes.h"
#include "cli/ap/ap_commands.h"
#include "cli/command_lines.h"

namespace taviwireless::cli {

void AddAPCommands(const Command& app, Options& options) {
    const Command ap = app.AddGroup("ap", "The Wi-Fi adapter as an access point");
    Add(ap, "status", "Show whether it is on, and where", options, ShowAP);
    Add(ap, "show", "Show the stored settings", options, ShowAPSettings)
        .AddFlag("--show-secrets", options.showSecrets, "Show the secrets as well");

    const Command set = Add(ap, "set", "Change stored settings", options, SetAP);
    set.AddOption("SETTING", options.settings,
                  "KEY=VALUE, or KEY alone for a secret, which is read from standard input")
        .Required();
    set.SetFooter(APSettingsHelp());

    Add(ap, "check", "Show what hostapd would be started with, and whether it understands that",
        options, CheckAP)
        .AddFlag("--show-secrets", options.showSecrets, "Show the secrets as well");
    const Command enable =
        Add(ap, "enable", "Switch it on, now and after a restart", options, EnableAP);
    const Argument isDryRun = enable.AddFlag("--dry-run", options.dryRun,
                                             "Only show what that would change in the network");
    enable
        .AddFlag("--open", options.openNetwork,
                 "Without stored settings, serve a network that everybody can join")
        .Excludes(isDryRun);
    Add(ap, "hotspot", "Serve a network with WPA2 and a new key, and show its QR code to join by",
        options, ServeHotspot)
        .AddOption("SSID", options.network, "Name of the network; without it, the stored one");
    Add(ap, "qr", "Show the QR code by which a telephone joins; it holds the key", options,
        ShowAPCode)
        .AddFlag("--guest", options.guest, "That of the network for guests");
    Add(ap, "stations", "List who is connected", options, ListStations);
    Add(ap, "disable", "Switch it off, now and after a restart", options, DisableAP);
}

}  // namespace taviwireless::cli
