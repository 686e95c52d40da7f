// taviwireless modem profile: the connection profile of the SIM in a modem.
#include <algorithm>

#include "base/join.h"
#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

constexpr size_t kMaxValue = profile::kValueSize - 1;  // bytes; what the library reads back

bool CanBeSet(const std::string& key) {
    return std::any_of(std::begin(kProfileKeys), std::end(kProfileKeys),
                       [&key](const auto& known) { return known.isStored && key == known.name; });
}

std::string SettableKeys() {
    std::string names;
    for (const ProfileKey& key : kProfileKeys) {
        if (key.isStored) {
            AddItem(names, key.name);
        }
    }
    return names;
}

// "KEY=VALUE", or "KEY" alone to read the value from standard input. Everything is checked before
// anything is set, so that a mistake changes nothing.
profile::Setting ParseSetting(const std::string& text) {
    const size_t equals = text.find('=');
    profile::Setting setting{text.substr(0, equals), ""};
    if (!CanBeSet(setting.key)) {
        throw CommandError(kUsage, "a profile has no setting " + Printable(setting.key) +
                                       "; there are " + SettableKeys());
    }
    setting.value = equals == std::string::npos ? ReadSecret("Value of " + setting.key)
                                                : text.substr(equals + 1);
    if (setting.value.find_first_of(profile::kLineEnds) != std::string::npos) {
        throw CommandError(kUsage, "the value of " + setting.key +
                                       " holds a line break, which a profile cannot keep");
    }
    if (setting.value.size() > kMaxValue) {
        throw CommandError(kUsage, "the value of " + setting.key + " is longer than " +
                                       std::to_string(kMaxValue) + " bytes");
    }
    if (setting.key == profile::kDefaultGateway && setting.value != "true" &&
        setting.value != "false") {
        throw CommandError(kUsage, "default_gw is true or false");
    }
    return setting;
}

// Makes the change. Prints a person nothing: what was asked for is done.
template <typename Change>
void ChangeAndReport(const Options& options, const Change& change) {
    const auto access = MakeAccess(options);
    Deadline deadline(options);
    deadline.Limit([&] { change(*access); });
    PrintOutcome(options, "", [&] {
        return Describe(deadline.Limit([&] { return access->ReadProfile(options.id); }),
                        options.showSecrets);
    });
}

}  // namespace

void ShowProfile(const Options& options) {
    const auto access = MakeAccess(options);
    const Profile profile =
        Deadline(options).Limit([&] { return access->ReadProfile(options.id); });
    Print(options, Describe(profile, options.showSecrets));
}

void SetProfile(const Options& options) {
    std::vector<profile::Setting> settings;
    for (const std::string& text : options.settings) {
        settings.push_back(ParseSetting(text));
    }
    ChangeAndReport(options,
                    [&](ModemAccess& access) { access.ChangeProfile(options.id, settings); });
}

void ResetProfile(const Options& options) {
    ChangeAndReport(options, [&](ModemAccess& access) { access.ResetProfile(options.id); });
}

}  // namespace taviwireless::cli
