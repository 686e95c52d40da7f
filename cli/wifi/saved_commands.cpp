// taviwireless wifi saved: the networks that were joined before.
#include <strings.h>

#include <algorithm>

#include "cli/adapter/requirements.h"
#include "cli/terminal.h"
#include "cli/wifi/station.h"
#include "cli/wifi/wifi_commands.h"
#include "cli/wifi/wifi_report.h"

namespace taviwireless::cli {

namespace {

bool IsCalled(const WirelessConf& conf, const std::string& name) {
    return name == conf.network.essid ||
           strcasecmp(name.c_str(), BssidText(conf.network.bssid).c_str()) == 0;
}

}  // namespace

void ListSavedNetworks(const Options& options) {
    RequireWifiSettings();
    Print(options, DescribeAll(SavedNetworks()));
}

WirelessConf SavedNetworkCalled(const std::string& name) {
    const auto saved = SavedNetworks();
    const auto found = std::find_if(saved.begin(), saved.end(),
                                    [&](const WirelessConf& conf) { return IsCalled(conf, name); });
    if (found == saved.end()) {
        throw CommandError(kNotFound, "no network " + Printable(name) +
                                          " is saved; taviwireless wifi saved list shows those "
                                          "that are");
    }
    return *found;
}

void ShowSavedNetwork(const Options& options) {
    RequireWifiSettings();
    Print(options, Describe(SavedNetworkCalled(options.network), options.showSecrets));
}

}  // namespace taviwireless::cli
