// SPDX-License-Identifier: MIT
// taviwireless wifi qr: a saved network for somebody else's telephone.
#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/command_error.h"
#include "cli/qr_code.h"
#include "cli/terminal.h"
#include "cli/wifi/saved_networks.h"
#include "cli/wifi/wifi_commands.h"

namespace taviwireless::cli {

namespace {

CodeNetwork CodeOf(const WirelessConf& conf) {
    const std::string ssid = conf.network.essid;
    switch (SecurityOf(conf.network)) {
        case Security::kOpen:
            return {ssid, "nopass", ""};
        case Security::kWEP:
            return {ssid, "WEP", conf.key};
        case Security::kWPA:
            return {ssid, "WPA", conf.key};
        default:
            throw CommandError(kFailure, "there is no QR code for the security of " +
                                             Printable(ssid) +
                                             ": a user has a password of his own, or it is none "
                                             "that is known here");
    }
}

}  // namespace

void ShowSavedCode(const Options& options) {
    RequireWifiSettings();
    PrintCode(options, CodeOf(SavedNetworksCalled(options.network).front()));
}

}  // namespace taviwireless::cli
