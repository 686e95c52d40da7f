// SPDX-License-Identifier: MIT
#include "cli/completed_arguments.h"

#include "cli/ap/ap_changes.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/wifi/saved_networks.h"
#include "cli/wifi/wifi_commands.h"

namespace taviwireless::cli {

namespace {

using Words = std::vector<std::string>;

Words SavedNames() {
    Words names;
    for (const WirelessConf& conf : SavedNetworks()) {
        names.emplace_back(conf.network.essid);
    }
    return names;
}

// Nothing where the files cannot be read: a shell has no use for a sentence.
template <Words (*kRead)()>
Words OrNone() {
    try {
        return kRead();
    } catch (const CommandError&) {
        return {};
    }
}

}  // namespace

ArgumentValues CompletedArguments() {
    return {{"ID", OrNone<PluggedModems>},   {"SSID", OrNone<SavedNames>},
            {"NETWORK", OrNone<SavedNames>}, {"SETTING", APSettingWords},
            {"CHANGE", SavedSettingWords},   {"KEY=VALUE", ProfileSettingWords}};
}

}  // namespace taviwireless::cli
