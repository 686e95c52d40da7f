// taviwireless, the library's functions for a person or a script: the commands, what they are
// called and what they take.
#include <signal.h>
#include <stdio.h>
#include <syslog.h>

#include <iostream>
#include <new>

#include "base/command_line/command_line.h"
#include "cli/adapter/credentials.h"
#include "cli/ap/ap_changes.h"
#include "cli/ap/ap_commands.h"
#include "cli/command_error.h"
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

using Run = void (*)(const Options& options);

Command Add(const Command& group, const char* name, const char* description, Options& options,
            Run run) {
    return group.AddCommand(name, description, [&options, run] { run(options); });
}

// Adds one command about modems, with what all of them take.
Command AddForModems(const Command& group, const char* name, const char* description,
                     Options& options, Run run) {
    const Command command = Add(group, name, description, options, run);
    command
        .AddOption("--timeout", options.timeout,
                   "Longest time that this may take once its input is read, in seconds",
                   "SECONDS:INT in [1 - 3600]")
        .Between(1, 3600);
    return command;
}

// Adds a command about one modem.
Command AddForOne(const Command& group, const char* name, const char* description, Options& options,
                  Run run) {
    const Command command = AddForModems(group, name, description, options, run);
    command.AddOption("ID", options.id, "Device id, such as usbmodem0").Required();
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
    AddForOne(profile, "set",
              "Change settings of the profile; the service connects a connected modem anew",
              options, SetProfile)
        .AddOption("KEY=VALUE", options.settings,
                   "Settings; KEY alone reads its value from standard input (for pass)")
        .Required();
    AddForOne(profile, "reset",
              "Write the profile anew, with the defaults of the modem; only with --direct", options,
              ResetProfile);
}

void AddConnectionCommands(const Command& modem, Options& options) {
    AddForOne(modem, "connect", "Dial, and wait until the link is up, at most 60 s or --timeout",
              options, ConnectModem)
        .AddFlag("--no-wait", options.noWait, "Return as soon as the dialler runs");
    AddForOne(modem, "disconnect", "Hang up", options, DisconnectModem);
    AddForOne(modem, "status", "Show the state of the connection; asks no modem", options,
              ShowConnection);
}

void AddModemCommands(const Command& app, Options& options) {
    const Command modem = app.AddGroup("modem", "USB modems that are plugged in");
    modem.AddFlag("--direct", options.direct, "Ask the modems without the modem service");

    AddForModems(
        modem, "list",
        "List the modems and what is known of them; asks only those that nobody has asked for 5 "
        "minutes",
        options, ListModems);
    AddForOne(modem, "show", "Ask one modem, and show it and its profile", options, ShowModem)
        .AddFlag("--show-secrets", options.showSecrets, "Show the password as well");
    AddForModems(
        modem, "watch",
        "Show the modems, or one, anew at every change that the service tells of, until SIGINT or "
        "SIGTERM; --timeout is that of one look",
        options, WatchModems)
        .AddOption("ID", options.id, "Device id, such as usbmodem0");
    AddPINCommands(modem, options);
    AddProfileCommands(modem, options);
    AddConnectionCommands(modem, options);
    AddForModems(modem, "interfaces", "List the network interfaces of the modems", options,
                 ListInterfaces);
}

void AddWifiConnectCommand(const Command& wifi, Options& options) {
    const Command connect =
        Add(wifi, "connect",
            "Join a network, and save it; its key is read from standard input unless saved",
            options, ConnectWifi);
    connect.AddOption("SSID", options.network, "Name of the network").Required();
    connect.AddOption("--user", options.user, "User, where a network wants one");
    connect.AddFlag("--new-key", options.newKey, "Ask for the key although one is saved");
    const Argument isStatic = connect.AddOption(
        "--static", options.staticAddress,
        "This address instead of one by DHCP, and the default gateway", "ADDRESS/PREFIX[,GATEWAY]");
    connect.AddFlag("--dhcp", options.dhcp, "DHCP although a static address is saved")
        .Excludes(isStatic);
    const Argument isHidden =
        connect.AddFlag("--hidden", options.hidden, "The network does not show in a scan");
    connect.AddOption("--security", options.security, "What a hidden network wants")
        .Needs(isHidden)
        .OneOf(SecurityWords());
}

void AddSavedNetworkCommands(const Command& wifi, Options& options) {
    const Command saved = wifi.AddGroup("saved", "The networks that were joined before");
    Add(saved, "list", "List them, the last used first", options, ListSavedNetworks);
    const Command show = Add(saved, "show", "Show one of them", options, ShowSavedNetwork);
    show.AddOption("NETWORK", options.network, "Its name, or the BSSID of its access point")
        .Required();
    show.AddFlag("--show-secrets", options.showSecrets, "Show the key as well");
}

void AddWifiCommands(const Command& app, Options& options) {
    const Command wifi = app.AddGroup("wifi", "The Wi-Fi adapter");
    Add(wifi, "status", "Show the state of the adapter and its connection", options, ShowWifi);
    Add(wifi, "scan", "List the networks in range", options, ListNetworks);
    AddWifiConnectCommand(wifi, options);
    Add(wifi, "disconnect", "End the connection", options, DisconnectWifi);
    Add(wifi, "auto", "Join the saved network that was used last and is in range", options,
        ConnectAutomatically);
    AddSavedNetworkCommands(wifi, options);

    const Command adhoc =
        Add(wifi, "adhoc", "Create or join an ad-hoc network", options, CreateAdhoc);
    adhoc.AddOption("SSID", options.network, "Name of the network").Required();
    adhoc.AddFlag("--wep", options.wep, "With a WEP key, which is read from standard input");

    Add(wifi, "mode", "Make the adapter an access point or a client", options, ChangeWifiMode)
        .AddOption("MODE", options.mode, "ap or client")
        .Required()
        .OneOf({"ap", "client"});
    Add(wifi, "gateway", "Show the gateway that the connection should use", options,
        ShowWifiGateway);
}

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

void Define(const Command& program, Options& options) {
    program.SetVersion("taviwireless " TAVI_VERSION);
    program.AddFlag("--json", options.json, "Print JSON instead of tables");
    program.AddFlag(
        "-v,--verbose", [] { openlog("taviwireless", LOG_PERROR, LOG_USER); },
        "Show the library's log on standard error as well");
    program.SetFooter(kFooter);
    program.RequireCommand();
    AddModemCommands(program, options);
    AddWifiCommands(program, options);
    AddAPCommands(program, options);
}

void RunCommandLine(int argc, char** argv, Options& options) {
    try {
        const bool isRun =
            ReadCommandLine(argc, argv, "taviwireless",
                            "Wireless connectivity of the appliance: USB modems and Wi-Fi",
                            [&](const Command& program) { Define(program, options); });
        if (isRun && !std::cout.flush()) {
            throw CommandError(kFailure, "cannot write the output");
        }
    } catch (const UsageError& error) {
        throw CommandError(kUsage, std::string(error.what()) + "; see taviwireless --help");
    }
}

}  // namespace

}  // namespace taviwireless::cli

int main(int argc, char** argv) {
    using namespace taviwireless::cli;
    signal(SIGCHLD, SIG_DFL);  // what started this may ignore it, and then no program has a result
    Options options;
    try {
        try {
            RunCommandLine(argc, argv, options);
            return kSuccess;
        } catch (const CommandError& error) {
            PrintFailure(options, error.what());
            return error.Status();
        } catch (const std::bad_alloc&) {
            PrintFailure(options, "there is not enough memory");
        } catch (const std::exception& error) {
            PrintFailure(options, std::string("failed: ") + error.what());
        }
    } catch (const std::bad_alloc&) {  // nor for the sentence
        fputs("taviwireless: there is not enough memory\n", stderr);
    }
    return kFailure;
}
