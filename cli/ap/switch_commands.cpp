// SPDX-License-Identifier: MIT
// taviwireless ap: the stored settings, and switching the access point on and off.
#include "cli/adapter/requirements.h"
#include "cli/ap/access_point.h"
#include "cli/ap/ap_changes.h"
#include "cli/ap/ap_commands.h"
#include "cli/ap/ap_report.h"
#include "cli/ap/channel_choice.h"
#include "cli/ap/country.h"
#include "cli/ap/setting_words.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "wireless/rules/paths.h"

namespace taviwireless::cli {

namespace {

void ShowPlan(const Options& options) {
    Report report;
    for (const std::string& line : PlanAP()) {
        report.document["plan"].append(line);
        report.rows.push_back({Printable(line)});
    }
    Print(options, report);
}

// A network that everybody can join has to be asked for: it is what one gets by default.
void RequireSecuritySaid(const APNetwork& network, const std::vector<APChange>& changes) {
    const std::string prefix = network.isForGuests ? "guest-" : "";
    if (network.security == WIRELESS_AP_OPEN && !FindChange(changes, prefix + "security")) {
        throw CommandError(kUsage, prefix + "security is not set: add " + prefix +
                                       "security=wpa2 " + prefix + "key, or " + prefix +
                                       "security=open for a network that everybody can join");
    }
}

}  // namespace

void RequireAPSupport() {
    RequireWifiSettings();
    if (TAVIWirelessAPIsSupported() != 1) {
        throw CommandError(kFailure,
                           std::string("there is no adapter that can be an access point: none is "
                                       "plugged in, or ") +
                               wireless::kAdapterInfo + " does not say AP_SUPPORT=yes");
    }
}

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
    const std::vector<APChange> changes = ReadAPChanges(options.settings);
    const bool hadGuests = settings.ap.guestEnabled != 0;
    ApplyAPChanges(changes, settings.ap);
    if (!AreStored(settings)) {
        RequireSecuritySaid(MainNetwork(settings.ap), changes);
    }
    if (settings.ap.guestEnabled != 0 && !hadGuests) {
        RequireSecuritySaid(GuestNetwork(settings.ap), changes);
    }
    CheckAPConf(settings.ap);
    const APChange* channel = FindChange(changes, "channel");
    std::string remark;
    if (channel != nullptr && channel->value == "auto") {
        remark = TakeEmptiestChannel(settings.ap);
    }
    if (const APChange* country = FindChange(changes, "country")) {
        StoreCountry(CountryOf(country->value));
    }
    StoreAPSettings(settings);
    PrintOutcome(options,
                 "Stored" + (remark.empty() ? "" : ", " + remark) +
                     "; taviwireless ap enable puts it into force.",
                 [&] {
                     Report report = Describe(settings);
                     report.document["remark"] = TextOrNull(remark);
                     return report;
                 });
}

void EnableAP(const Options& options) {
    RequireAPSupport();
    if (options.dryRun) {
        return ShowPlan(options);
    }
    if (options.openNetwork) {
        StoreOpenNetwork();
    }
    ShowProgress("Switching the access point on ...");
    const Switched switched = SwitchAPOn();
    Print(options, DescribeSwitchedOn(switched, ReadAPSettings().ap));
}

void DisableAP(const Options& options) {
    RequireWifiSettings();
    ShowProgress("Switching the access point off ...");
    const char* outcome = SwitchAPOff() ? "switched off" : "is off already";
    PrintOutcome(options, TAVIWirelessAPInterfaceGet() + std::string(": access point ") + outcome,
                 [] { return Describe(LookAtAP()); });
}

}  // namespace taviwireless::cli
