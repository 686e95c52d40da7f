// taviwireless ap: the stored settings, and switching the access point on and off.
#include <json/json.h>

#include "cli/ap/access_point.h"
#include "cli/ap/ap_changes.h"
#include "cli/ap/ap_commands.h"
#include "cli/ap/ap_report.h"
#include "cli/ap/setting_words.h"
#include "cli/wifi/station.h"
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
    Json::Value document;
    Table table;
    for (const std::string& line : PlanAP()) {
        document["plan"].append(line);
        table.push_back({Printable(line)});
    }
    options.json ? Print(document) : Print(table);
}

}  // namespace

// Needs no root.
void ShowAP(const Options& options) {
    const APStatus status = LookAtAP();
    options.json ? Print(ToJson(status)) : Print(StatusTable(status));
}

void ShowAPSettings(const Options& options) {
    RequireWifiSettings();
    const WirelessAPSettings settings = ReadAPSettings();
    options.json ? Print(ToJson(settings, options.showSecrets))
                 : Print(ShowTable(settings, options.showSecrets));
}

void SetAP(const Options& options) {
    RequireWifiSettings();
    WirelessAPSettings settings = ReadAPSettings();
    ApplyAPChanges(ReadAPChanges(options.settings), settings.ap);
    CheckAPConf(settings.ap);
    StoreAPSettings(settings);
    options.json ? Print(ToJson(settings, false))
                 : Print(Table{{"Stored; taviwireless ap enable puts it into force."}});
}

void EnableAP(const Options& options) {
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

void DisableAP(const Options& options) {
    RequireWifiSettings();
    ShowProgress("Switching the access point off ...");
    SwitchAPOff();
    options.json
        ? Print(ToJson(LookAtAP()))
        : Print(Table{{std::string(TAVIWirelessAPInterfaceGet()) + ": access point switched off"}});
}

}  // namespace taviwireless::cli
