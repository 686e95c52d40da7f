#include "cli/completed_arguments.h"

#include "base/split.h"
#include "cli/ap/ap_changes.h"
#include "cli/modem/modem_access.h"
#include "cli/wifi/station.h"

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

Words APSettings() {
    Words settings;
    for (const std::string& name : Split(APSettingNames(), ',')) {
        settings.push_back(name.substr(name.find_first_not_of(' ')) + "=");
    }
    return settings;
}

Words ProfileSettings() {
    Words settings;
    for (const ProfileKey& key : kProfileKeys) {
        if (key.isStored) {
            settings.push_back(std::string(key.name) + "=");
        }
    }
    return settings;
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
    return {{"ID", OrNone<PluggedModems>},
            {"SSID", OrNone<SavedNames>},
            {"NETWORK", OrNone<SavedNames>},
            {"SETTING", APSettings},
            {"KEY=VALUE", ProfileSettings}};
}

}  // namespace taviwireless::cli
