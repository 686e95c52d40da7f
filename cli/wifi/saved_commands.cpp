// taviwireless wifi saved: the networks that were joined before.
#include <json/json.h>
#include <strings.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <iostream>

#include "cli/commands.h"
#include "cli/wifi/access.h"
#include "cli/wifi/output.h"

namespace taviwireless::cli {

namespace {

void List(const Options& options) {
    RequireWifiSettings();
    const auto saved = SavedNetworks();
    if (options.json) {
        Print(ToJson(saved));
    } else {
        std::cout << ListText(saved);
    }
}

bool IsCalled(const WirelessConf& conf, const std::string& name) {
    return name == conf.network.essid ||
           strcasecmp(name.c_str(), BssidText(conf.network.bssid).c_str()) == 0;
}

// Of several access points with one name, the one that was used last.
void Show(const Options& options) {
    RequireWifiSettings();
    const auto saved = SavedNetworks();
    const auto found = std::find_if(saved.begin(), saved.end(), [&](const WirelessConf& conf) {
        return IsCalled(conf, options.network);
    });
    if (found == saved.end()) {
        throw CommandError(kNotFound, "no network " + Printable(options.network) +
                                          " is saved; taviwireless wifi saved list shows those "
                                          "that are");
    }
    options.json ? Print(ToJson(*found, options.showSecrets))
                 : Print(ShowTable(*found, options.showSecrets));
}

}  // namespace

void AddWifiSavedCommands(CLI::App& wifi, Options& options) {
    CLI::App* saved = wifi.add_subcommand("saved", "The networks that were joined before");
    saved->require_subcommand(1);
    saved->fallthrough();

    saved->add_subcommand("list", "List them, the last used first")->callback([&options] {
        List(options);
    });

    CLI::App* show = saved->add_subcommand("show", "Show one of them");
    show->add_option("NETWORK", options.network, "Its name, or the BSSID of its access point")
        ->required();
    show->add_flag("--show-secrets", options.showSecrets, "Show the key as well");
    show->callback([&options] { Show(options); });
}

}  // namespace taviwireless::cli
