// taviwireless ap: the stored settings, and switching the access point on and off.
#include "cli/adapter/requirements.h"
#include "cli/ap/access_point.h"
#include "cli/ap/ap_changes.h"
#include "cli/ap/ap_commands.h"
#include "cli/ap/ap_report.h"
#include "cli/ap/setting_words.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "wireless/rules/paths.h"

namespace taviwireless::cli {

namespace {

void RequireAPSupport() {
    RequireWifiSettings();
    if (TAVIWirelessAPIsSupported() != 1) {
        throw CommandError(kFailure,
                           std::string("there is no adapter that can be an access point: none is "
                                       "plugged in, or ") +
                               wireless::kAdapterInfo + " does not say AP_SUPPORT=yes");
    }
}

std::string WhoCanJoin(WirelessAPConf conf) {
    const APNetwork network = MainNetwork(conf);
    return network.security == WIRELESS_AP_OPEN ? "open: everybody can join"
                                                : "security " + SecurityWord(network);
}

void ShowPlan(const Options& options) {
    Report report;
    for (const std::string& line : PlanAP()) {
        report.document["plan"].append(line);
        report.rows.push_back({Printable(line)});
    }
    Print(options, report);
}

void PrintOutcomeOfSwitching(const Options& options, const std::string& outcome) {
    PrintOutcome(options, TAVIWirelessAPInterfaceGet() + (": access point " + outcome),
                 [] { return Describe(LookAtAP()); });
}

}  // namespace

// Needs no root.
void ShowAP(const Options& options) {
    Print(options, Describe(LookAtAP()));
}

void ShowAPSettings(const Options& options) {
    RequireWifiSettings();
    Print(options, Describe(ReadAPSettings(), options.showSecrets));
}

void SetAP(const Options& options) {
    RequireWifiSettings();
    WirelessAPSettings settings = ReadAPSettings();
    ApplyAPChanges(ReadAPChanges(options.settings), settings.ap);
    CheckAPConf(settings.ap);
    StoreAPSettings(settings);
    PrintOutcome(options, "Stored; taviwireless ap enable puts it into force.",
                 [&] { return Describe(settings); });
}

void EnableAP(const Options& options) {
    RequireAPSupport();
    if (options.dryRun) {
        return ShowPlan(options);
    }
    ShowProgress("Switching the access point on ...");
    SwitchAPOn();
    const WirelessAPConf conf = ReadAPSettings().ap;
    PrintOutcomeOfSwitching(options, Printable(conf.ssid) + " switched on, " + WhoCanJoin(conf));
}

void DisableAP(const Options& options) {
    RequireWifiSettings();
    ShowProgress("Switching the access point off ...");
    SwitchAPOff();
    PrintOutcomeOfSwitching(options, "switched off");
}

}  // namespace taviwireless::cli
