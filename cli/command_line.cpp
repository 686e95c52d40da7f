// What the command line understands: the commands, what they are called and what they take. CLI11
// is a header that takes seconds to compile, so nothing else includes it.
#include "cli/command_line.h"

#include <syslog.h>

#include <CLI/CLI.hpp>
#include <iostream>

#include "cli/adapter/credentials.h"
#include "cli/ap/ap_changes.h"
#include "cli/ap/ap_commands.h"
#include "cli/modem/modem_commands.h"
#include "cli/report.h"
#include "cli/wifi/wifi_commands.h"

namespace taviwireless::cli {

namespace {

constexpr char kFooter[] =
    "Exit status: 0 done, 1 failed, 2 wrong usage, 3 no such modem or network, 4 busy: it "
    "has a connection already, or is connecting; 5 the modem service is not running.\n"
    "With --json, a failure is {\"error\": SENTENCE} on standard output.\n"
    "Details of failures are in the system log; --verbose shows them here as well.";

int Fail(const Options& options, ExitStatus status, const std::string& sentence) {
    PrintFailure(options.json, sentence);
    return status;
}
using Run = void (*)(const Options& options);

CLI::App& AddGroup(CLI::App& parent, const char* name, const char* description) {
    CLI::App* group = parent.add_subcommand(name, description);
    group->require_subcommand(1);
    group->fallthrough();
    return *group;
}

CLI::App& Add(CLI::App& group, const char* name, const char* description, Options& options,
              Run run) {
    CLI::App* command = group.add_subcommand(name, description);
    command->callback([&options, run] { run(options); });
    return *command;
}

// Adds one command about modems, with what all of them take.
CLI::App& AddForModems(CLI::App& group, const char* name, const char* description, Options& options,
                       Run run) {
    CLI::App& command = Add(group, name, description, options, run);
    command
        .add_option("--timeout", options.timeout,
                    "Longest time that this may take once its input is read, in seconds")
        ->check(CLI::Range(1, 3600))
        ->type_name("SECONDS");
    return command;
}

// Adds a command about one modem.
CLI::App& AddForOne(CLI::App& group, const char* name, const char* description, Options& options,
                    Run run) {
    CLI::App& command = AddForModems(group, name, description, options, run);
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
    CLI::App& pin = AddGroup(modem, "pin", "PIN of the SIM; it is read from standard input");
    add(pin, "set", "Change the PIN; the old one is read, then the new one", ChangePIN);
    add(pin, "protect", "Let the SIM ask for its PIN", ProtectSIM);
    add(pin, "unprotect", "Let the SIM do without its PIN", UnprotectSIM);
    add(modem, "puk", "Set a new PIN with the PUK; the PUK is read, then the PIN", UsePUK);
}

void AddProfileCommands(CLI::App& modem, Options& options) {
    CLI::App& profile = AddGroup(modem, "profile", "Connection profile of the SIM in a modem");
    AddForOne(profile, "show", "Show the profile; one is made for a new SIM", options, ShowProfile)
        .add_flag("--show-secrets", options.showSecrets, "Show the password as well");
    AddForOne(profile, "set",
              "Change settings of the profile; the service connects a connected modem anew",
              options, SetProfile)
        .add_option("KEY=VALUE", options.settings,
                    "Settings; KEY alone reads its value from standard input (for pass)")
        ->required();
    AddForOne(profile, "reset",
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

void AddModemCommands(CLI::App& app, Options& options) {
    CLI::App& modem = AddGroup(app, "modem", "USB modems that are plugged in");
    modem.add_flag("--direct", options.direct, "Ask the modems without the modem service");

    AddForModems(modem, "list", "List the modems and what they say of themselves", options,
                 ListModems);
    AddForOne(modem, "show", "Show one modem and its profile", options, ShowModem)
        .add_flag("--show-secrets", options.showSecrets, "Show the password as well");
    AddForModems(
        modem, "watch",
        "Show the modems, or one, anew at every change until SIGINT or SIGTERM; --timeout is that "
        "of one look",
        options, WatchModems)
        .add_option("ID", options.id, "Device id, such as usbmodem0");
    AddPINCommands(modem, options);
    AddProfileCommands(modem, options);
    AddConnectionCommands(modem, options);
    AddForModems(modem, "interfaces", "List the network interfaces of the modems", options,
                 ListInterfaces);
}

void AddWifiConnectCommand(CLI::App& wifi, Options& options) {
    CLI::App& connect =
        Add(wifi, "connect",
            "Join a network, and save it; its key is read from standard input unless saved",
            options, ConnectWifi);
    connect.add_option("SSID", options.network, "Name of the network")->required();
    connect.add_option("--user", options.user, "User, where a network wants one");
    connect.add_flag("--new-key", options.newKey, "Ask for the key although one is saved");
    CLI::Option* isStatic =
        connect
            .add_option("--static", options.staticAddress,
                        "This address instead of one by DHCP, and the default gateway")
            ->type_name("ADDRESS/PREFIX[,GATEWAY]");
    connect.add_flag("--dhcp", options.dhcp, "DHCP although a static address is saved")
        ->excludes(isStatic);
    CLI::Option* isHidden =
        connect.add_flag("--hidden", options.hidden, "The network does not show in a scan");
    connect.add_option("--security", options.security, "What a hidden network wants")
        ->needs(isHidden)
        ->check(CLI::IsMember(SecurityWords()));
}

void AddSavedNetworkCommands(CLI::App& wifi, Options& options) {
    CLI::App& saved = AddGroup(wifi, "saved", "The networks that were joined before");
    Add(saved, "list", "List them, the last used first", options, ListSavedNetworks);
    CLI::App& show = Add(saved, "show", "Show one of them", options, ShowSavedNetwork);
    show.add_option("NETWORK", options.network, "Its name, or the BSSID of its access point")
        ->required();
    show.add_flag("--show-secrets", options.showSecrets, "Show the key as well");
}

void AddWifiCommands(CLI::App& app, Options& options) {
    CLI::App& wifi = AddGroup(app, "wifi", "The Wi-Fi adapter");
    Add(wifi, "status", "Show the state of the adapter and its connection", options, ShowWifi);
    Add(wifi, "scan", "List the networks in range", options, ListNetworks);
    AddWifiConnectCommand(wifi, options);
    Add(wifi, "disconnect", "End the connection", options, DisconnectWifi);
    Add(wifi, "auto", "Join the saved network that was used last and is in range", options,
        ConnectAutomatically);
    AddSavedNetworkCommands(wifi, options);

    CLI::App& adhoc = Add(wifi, "adhoc", "Create or join an ad-hoc network", options, CreateAdhoc);
    adhoc.add_option("SSID", options.network, "Name of the network")->required();
    adhoc.add_flag("--wep", options.wep, "With a WEP key, which is read from standard input");

    Add(wifi, "mode", "Make the adapter an access point or a client", options, ChangeWifiMode)
        .add_option("MODE", options.mode, "ap or client")
        ->required()
        ->check(CLI::IsMember({"ap", "client"}));
    Add(wifi, "gateway", "Show the gateway that the connection should use", options,
        ShowWifiGateway);
}

void AddAPCommands(CLI::App& app, Options& options) {
    CLI::App& ap = AddGroup(app, "ap", "The Wi-Fi adapter as an access point");
    Add(ap, "status", "Show whether it is on, and where", options, ShowAP);
    Add(ap, "show", "Show the stored settings", options, ShowAPSettings)
        .add_flag("--show-secrets", options.showSecrets, "Show the secrets as well");

    CLI::App& set = Add(ap, "set", "Change stored settings", options, SetAP);
    set.add_option("SETTING", options.settings,
                   "KEY=VALUE, or KEY alone for a secret, which is read from standard input")
        ->required();
    set.footer("Settings: " + APSettingNames());

    Add(ap, "check", "Show what hostapd would be started with, and whether it understands that",
        options, CheckAP)
        .add_flag("--show-secrets", options.showSecrets, "Show the secrets as well");
    Add(ap, "enable", "Switch it on, now and after a restart", options, EnableAP)
        .add_flag("--dry-run", options.dryRun, "Only show what that would change in the network");
    Add(ap, "disable", "Switch it off, now and after a restart", options, DisableAP);
}

}  // namespace

int RunCommandLine(int argc, char** argv) {
    CLI::App app("Wireless connectivity of the appliance: USB modems and Wi-Fi", "taviwireless");
    Options options;
    app.set_version_flag("--version", "taviwireless " TAVI_VERSION);
    app.add_flag("--json", options.json, "Print JSON instead of tables");
    app.add_flag_callback(
        "-v,--verbose", [] { openlog("taviwireless", LOG_PERROR, LOG_USER); },
        "Show the library's log on standard error as well");
    app.footer(kFooter);
    app.require_subcommand(1);
    app.fallthrough();
    AddModemCommands(app, options);
    AddWifiCommands(app, options);
    AddAPCommands(app, options);
    try {
        app.parse(argc, argv);
        return std::cout.flush() ? kSuccess : Fail(options, kFailure, "cannot write the output");
    } catch (const CLI::ParseError& error) {
        if (error.get_exit_code() == static_cast<int>(CLI::ExitCodes::Success)) {
            return app.exit(error);  // --help, --version
        }
        return Fail(options, kUsage, std::string(error.what()) + "; see taviwireless --help");
    } catch (const CommandError& error) {
        return Fail(options, error.Status(), error.what());
    }
}
}  // namespace taviwireless::cli
