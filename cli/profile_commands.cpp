// taviwireless modem profile: the connection profile of the SIM in a modem.
#include <json/json.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>

#include "cli/commands.h"
#include "cli/output.h"
#include "cli/plugged_modem.h"
#include "cli/secret.h"

namespace taviwireless::cli {

namespace {

using usbmodem_lib::USBModem;
using usbmodem_lib::USBModemList;

constexpr size_t kMaxValue = 1023;  // bytes; what the library reads back
constexpr char kPassword[] = "pass";

// The keys of a profile, in the order in which they are shown.
constexpr struct {
    const char* name;
    const char* title;
    bool canBeSet;
} kKeys[] = {
    {"number", "Number", true},    {"user", "User", true},
    {kPassword, "Password", true}, {"apn", "APN", true},
    {"isp", "Operator", true},     {"location", "Location", true},
    {"IMSI", "IMSI", false},       {"default_gw", "Default route", true},
};

struct Arguments {
    std::string id;
    std::vector<std::string> settings;
    bool showSecrets = false;
};

bool CanBeSet(const std::string& key) {
    return std::any_of(std::begin(kKeys), std::end(kKeys),
                       [&key](const auto& known) { return known.canBeSet && key == known.name; });
}

std::string SettableKeys() {
    std::string names;
    for (const auto& key : kKeys) {
        if (key.canBeSet) {
            names += (names.empty() ? "" : ", ") + std::string(key.name);
        }
    }
    return names;
}

struct Setting {
    std::string key;
    std::string value;
};

// "KEY=VALUE", or "KEY" alone to read the value from standard input. Everything is checked before
// anything is set, so that a mistake changes nothing.
Setting ParseSetting(const std::string& text) {
    const size_t equals = text.find('=');
    Setting setting{text.substr(0, equals), ""};
    if (!CanBeSet(setting.key)) {
        throw CommandError(kUsage, "a profile has no setting " + Printable(setting.key) +
                                       "; there are " + SettableKeys());
    }
    setting.value = equals == std::string::npos ? ReadSecret("Value of " + setting.key)
                                                : text.substr(equals + 1);
    if (setting.value.find_first_of("\r\n") != std::string::npos) {
        throw CommandError(kUsage, "the value of " + setting.key +
                                       " holds a line break, which a profile cannot keep");
    }
    if (setting.value.size() > kMaxValue) {
        throw CommandError(kUsage, "the value of " + setting.key + " is longer than " +
                                       std::to_string(kMaxValue) + " bytes");
    }
    if (setting.key == "default_gw" && setting.value != "true" && setting.value != "false") {
        throw CommandError(kUsage, "default_gw is true or false");
    }
    return setting;
}

void Show(const Options& options, const Arguments& arguments) {
    USBModemList list;
    USBModem& modem = InitialisedModem(list, arguments.id);
    Json::Value document;
    Table table;
    for (const auto& key : kKeys) {
        bool failed = false;
        std::string value = modem.GetProfileWithKey(key.name, failed);
        if (failed) {
            throw CommandError(kFailure, "cannot read the profile of " + arguments.id +
                                             "; is the SIM ready, and /var/lib/usbmodem readable?");
        }
        if (key.name == std::string(kPassword) && !arguments.showSecrets) {
            value = value.empty() ? "" : "********";
        }
        document[key.name] = value;
        table.push_back({key.title, Printable(value)});
    }
    ShowProgress("");
    options.json ? Print(document) : Print(table);
}

void Set(const Arguments& arguments) {
    std::vector<Setting> settings;
    for (const std::string& text : arguments.settings) {
        settings.push_back(ParseSetting(text));
    }
    USBModemList list;
    USBModem& modem = InitialisedModem(list, arguments.id);
    ShowProgress("");
    for (const Setting& setting : settings) {
        if (modem.SetProfileWithKey(setting.key, setting.value) != 0) {
            throw CommandError(kFailure, "cannot set " + setting.key + " in the profile of " +
                                             arguments.id +
                                             "; is the SIM ready, and /var/lib/usbmodem writable?");
        }
    }
}

void Reset(const Arguments& arguments) {
    USBModemList list;
    USBModem& modem = InitialisedModem(list, arguments.id);
    ShowProgress("Reading defaults from " + arguments.id + " ...");
    const int result = modem.SetProfileToDefault();
    ShowProgress("");
    if (result != 0) {
        throw CommandError(kFailure, "cannot reset the profile of " + arguments.id +
                                         "; is the SIM ready, and /var/lib/usbmodem writable?");
    }
}

}  // namespace

void AddProfileCommands(CLI::App& modem, const Options& options) {
    CLI::App* profile = modem.add_subcommand("profile", "Connection profile of the SIM in a modem");
    profile->require_subcommand(1);
    profile->fallthrough();
    const auto arguments = std::make_shared<Arguments>();
    const auto add = [&](const char* name, const char* description) {
        CLI::App* command = profile->add_subcommand(name, description);
        command->add_option("ID", arguments->id, "Device id, such as usbmodem0")->required();
        return command;
    };

    CLI::App* show = add("show", "Show the profile; one is made for a new SIM");
    show->add_flag("--show-secrets", arguments->showSecrets, "Show the password as well");
    show->callback([&options, arguments] { Show(options, *arguments); });

    CLI::App* set = add("set", "Change settings of the profile");
    set->add_option("KEY=VALUE", arguments->settings,
                    "Settings; KEY alone reads its value from standard input (for pass)")
        ->required();
    set->callback([arguments] { Set(*arguments); });

    add("reset", "Write the profile anew, with the defaults of the modem")->callback([arguments] {
        Reset(*arguments);
    });
}

}  // namespace taviwireless::cli
