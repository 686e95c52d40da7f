// taviwireless modem: what its commands are called, and what they take.
#include "cli/modem/commands.h"

#include <CLI/CLI.hpp>

namespace taviwireless::cli {

namespace {

using Run = void (*)(const Options& options);

// Adds one command about modems, with what all of them take.
CLI::App& Add(CLI::App& group, const char* name, const char* description, Options& options,
              Run run) {
    CLI::App* command = group.add_subcommand(name, description);
    command
        ->add_option("--timeout", options.timeout,
                     "Longest time that this may take once its input is read, in seconds")
        ->check(CLI::Range(1, 3600))
        ->type_name("SECONDS");
    command->callback([&options, run] { run(options); });
    return *command;
}

// Adds a command about one modem.
CLI::App& AddForOne(CLI::App& group, const char* name, const char* description, Options& options,
                    Run run) {
    CLI::App& command = Add(group, name, description, options, run);
    command.add_option("ID", options.id, "Device id, such as usbmodem0")->required();
    return command;
}

void AddPINCommands(CLI::App& modem, Options& options) {
    const auto add = [&options](CLI::App& group, const char* name, const char* description,
                                Run run) {
        AddForOne(group, name, description, options, run)
            .add_flag("--force", options.force, "Use the last attempt without a question");
    };
    add(modem, "unlock", "Enter the PIN; it is read from standard input", UnlockSIM);
    CLI::App* pin = modem.add_subcommand("pin", "PIN of the SIM; it is read from standard input");
    pin->require_subcommand(1);
    pin->fallthrough();
    add(*pin, "set", "Change the PIN; the old one is read, then the new one", ChangePIN);
    add(*pin, "protect", "Let the SIM ask for its PIN", ProtectSIM);
    add(*pin, "unprotect", "Let the SIM do without its PIN", UnprotectSIM);
    add(modem, "puk", "Set a new PIN with the PUK; the PUK is read, then the PIN", UsePUK);
}

void AddProfileCommands(CLI::App& modem, Options& options) {
    CLI::App* profile = modem.add_subcommand("profile", "Connection profile of the SIM in a modem");
    profile->require_subcommand(1);
    profile->fallthrough();
    AddForOne(*profile, "show", "Show the profile; one is made for a new SIM", options, ShowProfile)
        .add_flag("--show-secrets", options.showSecrets, "Show the password as well");
    AddForOne(*profile, "set",
              "Change settings of the profile; the service connects a connected modem anew",
              options, SetProfile)
        .add_option("KEY=VALUE", options.settings,
                    "Settings; KEY alone reads its value from standard input (for pass)")
        ->required();
    AddForOne(*profile, "reset",
              "Write the profile anew, with the defaults of the modem; only with --direct", options,
              ResetProfile);
}

void AddConnectionCommands(CLI::App& modem, Options& options) {
    AddForOne(modem, "connect", "Dial, and wait until the link is up, at most 60 s or --timeout",
              options, ConnectModem)
        .add_flag("--no-wait", options.noWait, "Return as soon as the dialler runs");
    AddForOne(modem, "disconnect", "Hang up", options, DisconnectModem);
    AddForOne(modem, "status", "Show the state of the connection", options, ShowConnection);
}

}  // namespace

void AddModemCommands(CLI::App& app, Options& options) {
    CLI::App* modem = app.add_subcommand("modem", "USB modems that are plugged in");
    modem->add_flag("--direct", options.direct, "Ask the modems without the modem service");
    modem->require_subcommand(1);
    modem->fallthrough();

    Add(*modem, "list", "List the modems and what they say of themselves", options, ListModems);
    AddForOne(*modem, "show", "Show one modem and its profile", options, ShowModem)
        .add_flag("--show-secrets", options.showSecrets, "Show the password as well");
    Add(*modem, "watch",
        "Show the modems, or one, anew at every change until SIGINT or SIGTERM; --timeout is that "
        "of one look",
        options, WatchModems)
        .add_option("ID", options.id, "Device id, such as usbmodem0");
    AddPINCommands(*modem, options);
    AddProfileCommands(*modem, options);
    AddConnectionCommands(*modem, options);
    Add(*modem, "interfaces", "List the network interfaces of the modems", options, ListInterfaces);
}

}  // namespace taviwireless::cli
