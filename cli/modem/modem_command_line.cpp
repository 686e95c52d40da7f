// SPDX-License-Identifier: MIT
// taviwireless modem: the commands, what they are called and what they take.
#include "cli/command_lines.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"

namespace taviwireless::cli {

namespace {

constexpr char kIdHelp[] = "Device id, such as usbmodem0, or its number alone";

constexpr char kSettingsHelp[] =
    "Settings:\n"
    "  number=NUMBER          what the modem dials: digits, *, #, + and commas (*99# if empty)\n"
    "  user=NAME              for the provider's login\n"
    "  password               likewise; stands alone, and is read from standard input\n"
    "  apn=NAME               access point name, such as internet (if empty, the modem's own)\n"
    "  isp=TEXT               the provider, for people\n"
    "  location=TEXT          where that is, for people\n"
    "  default-route=yes|no   whether the connection takes the default route\n"
    "Roaming is shown, and up to the network.";

// Adds one command about modems.
Command AddForModems(const Command& group, const char* name, const char* description,
                     Options& options, Run run) {
    return group.AddCommand(name, description, [&options, run] {
        options.id = FullId(options.id);
        run(options);
    });
}

// Adds a command about one modem.
Command AddForOne(const Command& group, const char* name, const char* description, Options& options,
                  Run run) {
    const Command command = AddForModems(group, name, description, options, run);
    command.AddOption("ID", options.id, kIdHelp).Required();
    return command;
}

void AddPINCommands(const Command& modem, Options& options) {
    const auto add = [&options](const Command& group, const char* name, const char* description,
                                Run run) {
        AddForOne(group, name, description, options, run)
            .AddFlag("--force", options.force, "Use the last attempt without a question");
    };
    add(modem, "unlock", "Enter the PIN; it is read from standard input", UnlockSIM);
    const Command pin = modem.AddGroup("pin", "PIN of the SIM; it is read from standard input");
    add(pin, "set", "Change the PIN; the old one is read, then the new one", ChangePIN);
    add(pin, "protect", "Let the SIM ask for its PIN", ProtectSIM);
    add(pin, "unprotect", "Let the SIM do without its PIN", UnprotectSIM);
    add(modem, "puk", "Set a new PIN with the PUK; the PUK is read, then the PIN", UsePUK);
}

void AddProfileCommands(const Command& modem, Options& options) {
    const Command profile = modem.AddGroup("profile", "Connection profile of the SIM in a modem");
    AddForOne(profile, "show", "Show the profile; one is made for a new SIM", options, ShowProfile)
        .AddFlag("--show-secrets", options.showSecrets, "Show the password as well");
    const Command set =
        AddForOne(profile, "set",
                  "Change settings of the profile; the service connects a connected modem anew",
                  options, SetProfile);
    set.AddOption("KEY=VALUE", options.settings, "Settings; password alone").Required();
    set.SetFooter(kSettingsHelp);
    AddForOne(profile, "reset",
              "Write the profile anew, with the defaults of the modem; only with --direct", options,
              ResetProfile);
}

void AddConnectionCommands(const Command& modem, Options& options) {
    AddForOne(modem, "connect",
              "Dial, and wait until the link is up, at most 60 s or --timeout; after that, and at "
              "SIGINT, what was dialled is hung up",
              options, ConnectModem)
        .AddFlag("--no-wait", options.noWait, "Return as soon as the dialler runs");
    AddForOne(modem, "disconnect", "Hang up", options, DisconnectModem);
    AddForOne(modem, "status", "Show the state of the connection; asks no modem", options,
              ShowConnection);
}

}  // namespace

void AddModemCommands(const Command& app, Options& options) {
    const Command modem = app.AddGroup("modem", "USB modems that are plugged in");
    modem.AddFlag("--direct", options.direct, "Ask the modems without the modem service");

    Add(modem, "list",
        "List the modems and what is known of them; asks only those that nobody has asked for 5 "
        "minutes",
        options, ListModems);
    AddForOne(modem, "show", "Ask one modem, and show it and its profile", options, ShowModem)
        .AddFlag("--show-secrets", options.showSecrets, "Show the password as well");
    AddForModems(
        modem, "watch",
        "Show the modems, or one, anew at every change that the service tells of, with the last "
        "signals drawn, until SIGINT or SIGTERM; --timeout is that of one look",
        options, WatchModems)
        .AddOption("ID", options.id, kIdHelp);
    AddPINCommands(modem, options);
    AddProfileCommands(modem, options);
    AddConnectionCommands(modem, options);
    AddForModems(modem, "interfaces", "List the network interfaces; asks no modem", options,
                 ListInterfaces);
    AddForModems(modem, "usage", "Show the bytes that went over each connection; asks no modem",
                 options, ShowUsage)
        .AddOption("ID", options.id, kIdHelp);
    AddForOne(modem, "at",
              "For support: send an AT command, whatever it does, and show what the modem answers",
              options, SendATCommand)
        .AddOption("COMMAND", options.atCommand,
                   "Such as ATI; without one it is read from standard input, as is best for one "
                   "that holds a PIN");
}

}  // namespace taviwireless::cli
