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
    set.SetFooter("Settings: " + APSettingNames());

    Add(ap, "check", "Show what hostapd would be started with, and whether it understands that",
        options, CheckAP)
        .AddFlag("--show-secrets", options.showSecrets, "Show the secrets as well");
    Add(ap, "enable", "Switch it on, now and after a restart", options, EnableAP)
        .AddFlag("--dry-run", options.dryRun, "Only show what that would change in the network");
    Add(ap, "disable", "Switch it off, now and after a restart", options, DisableAP);
}

}  // namespace taviwireless::cli
