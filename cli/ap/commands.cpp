// taviwireless ap: the Wi-Fi adapter as an access point.
#include "cli/commands.h"

#include <json/json.h>

#include <CLI/CLI.hpp>

#include "cli/ap/access.h"
#include "cli/ap/output.h"
#include "cli/ap/settings.h"
#include "cli/ap/words.h"
#include "cli/wifi/access.h"

namespace taviwireless::cli {

namespace {

// For everybody.
void Status(const Options& options) {
    const APStatus status = LookAtAP();
    options.json ? Print(ToJson(status)) : Print(StatusTable(status));
}

void Show(const Options& options) {
    RequireWifiSettings();
    const WirelessAPSettings settings = ReadAPSettings();
    options.json ? Print(ToJson(settings, options.showSecrets))
                 : Print(ShowTable(settings, options.showSecrets));
}

void Set(const Options& options) {
    RequireWifiSettings();
    WirelessAPSettings settings = ReadAPSettings();
    ApplyAPChanges(ReadAPChanges(options.settings), settings.ap);
    CheckAPConf(settings.ap);
    StoreAPSettings(settings);
    options.json ? Print(ToJson(settings, false))
                 : Print(Table{{"Stored; taviwireless ap enable puts it into force."}});
}

void RequireAPSupport() {
    RequireWifiSettings();
    if (TAVIWirelessAPIsSupported() != 1) {
        throw CommandError(kFailure,
                           "there is no adapter that can be an access point: none is plugged in, "
                           "or /tmp/wireless.info does not say AP_SUPPORT=yes");
    }
}

std::string WhoCanJoin(WirelessAPConf conf) {
    const APNetwork network = MainNetwork(conf);
    return network.security == WIRELESS_AP_OPEN ? "open: everybody can join"
                                                : "security " + SecurityWord(network);
}

void ShowPlan(const Options& options) {
    Json::Value document;
    Table table;
    for (const std::string& line : PlanAP()) {
        document["plan"].append(line);
        table.push_back({Printable(line)});
    }
    options.json ? Print(document) : Print(table);
}

void Enable(const Options& options) {
    RequireAPSupport();
    if (options.dryRun) {
        return ShowPlan(options);
    }
    ShowProgress("Switching the access point on ...");
    SwitchAPOn();
    const WirelessAPConf conf = ReadAPSettings().ap;
    options.json ? Print(ToJson(LookAtAP()))
                 : Print(Table{{std::string(TAVIWirelessAPInterfaceGet()) + ": access point " +
                                Printable(conf.ssid) + " switched on, " + WhoCanJoin(conf)}});
}

void Disable(const Options& options) {
    RequireWifiSettings();
    ShowProgress("Switching the access point off ...");
    SwitchAPOff();
    options.json
        ? Print(ToJson(LookAtAP()))
        : Print(Table{{std::string(TAVIWirelessAPInterfaceGet()) + ": access point switched off"}});
}

}  // namespace

void AddAPCommands(CLI::App& app, Options& options) {
    CLI::App* ap = app.add_subcommand("ap", "The Wi-Fi adapter as an access point");
    ap->require_subcommand(1);
    ap->fallthrough();
    const auto add = [&](const char* name, const char* description, void (*run)(const Options&)) {
        CLI::App* command = ap->add_subcommand(name, description);
        command->callback([&options, run] { run(options); });
        return command;
    };

    add("status", "Show whether it is on, and where", Status);
    add("show", "Show the stored settings", Show)
        ->add_flag("--show-secrets", options.showSecrets, "Show the secrets as well");

    CLI::App* set = add("set", "Change stored settings", Set);
    set->add_option("SETTING", options.settings,
                    "KEY=VALUE, or KEY alone for a secret, which is read from standard input")
        ->required();
    set->footer("Settings: " + APSettingNames());

    AddAPCheckCommand(*ap, options);
    add("enable", "Switch it on, now and after a restart", Enable)
        ->add_flag("--dry-run", options.dryRun, "Only show what that would change in the network");
    add("disable", "Switch it off, now and after a restart", Disable);
}

}  // namespace taviwireless::cli
