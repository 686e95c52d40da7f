// SPDX-License-Identifier: MIT
// taviwireless modem profile: the connection profile of the SIM in a modem.
#include <algorithm>
#include <cctype>
#include <cstring>

#include "base/join.h"
#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

constexpr size_t kMaxValue = profile::kValueSize - 1;  // bytes; what the library reads back

constexpr size_t kMaxAPN = 100;                // bytes (3GPP TS 23.003, 9.1)
constexpr char kDialled[] = "0123456789*#+,";  // what a modem dials
constexpr char kPunctuation[] = "-._";

// As a person writes it.
std::string Word(const ProfileKey& key) {
    std::string word = key.shown;
    std::replace(word.begin(), word.end(), '_', '-');
    return word;
}

const ProfileKey* FindKey(const std::string& word) {
    const auto found =
        std::find_if(std::begin(kProfileKeys), std::end(kProfileKeys),
                     [&word](const auto& key) { return key.isStored && word == Word(key); });
    return found == std::end(kProfileKeys) ? nullptr : found;
}

std::string SettableKeys() {
    std::string names;
    for (const ProfileKey& key : kProfileKeys) {
        if (key.isStored) {
            AddItem(names, Word(key));
        }
    }
    return names;
}

// Refuses what no modem could do anything with.
void CheckNumber(const std::string& number) {
    if (number.find_first_not_of(kDialled) != std::string::npos) {
        throw CommandError(
            kUsage, "number is what the modem dials: digits, *, #, + and commas, such as *99#");
    }
}

void CheckAPN(const std::string& apn) {
    const bool isName = std::all_of(apn.begin(), apn.end(), [](char c) {
        return isalnum(static_cast<unsigned char>(c)) != 0 || strchr(kPunctuation, c) != nullptr;
    });
    if (!isName || apn.size() > kMaxAPN) {
        throw CommandError(kUsage,
                           "apn is a name of the provider's, of at most 100 letters, digits, "
                           "\"-\", \".\" and \"_\", such as internet");
    }
}

std::string ReadSwitch(const std::string& value) {
    if (value != "yes" && value != "no") {
        throw CommandError(kUsage, "default-route is yes or no");
    }
    return value == "yes" ? "true" : "false";
}

void CheckText(const std::string& word, const std::string& value) {
    if (value.find_first_of(profile::kLineEnds) != std::string::npos) {
        throw CommandError(
            kUsage, "the value of " + word + " holds a line break, which a profile cannot keep");
    }
    if (value.size() > kMaxValue) {
        throw CommandError(kUsage, "the value of " + word + " is longer than " +
                                       std::to_string(kMaxValue) + " bytes");
    }
}

// "KEY=VALUE", or "password" alone, which is read from standard input. Everything is checked before
// anything is set, so that a mistake changes nothing.
profile::Setting ParseSetting(const std::string& text) {
    const size_t equals = text.find('=');
    const std::string word = text.substr(0, equals);
    const ProfileKey* key = FindKey(word);
    if (key == nullptr) {
        throw CommandError(kUsage, "a profile has no setting " + Printable(word) + "; there are " +
                                       SettableKeys());
    }
    const bool isSecret = key->name == std::string(profile::kPassword);
    if (isSecret != (equals == std::string::npos)) {
        throw CommandError(kUsage, isSecret
                                       ? "password stands alone: it is read from standard input, "
                                         "where nobody sees it"
                                       : word + " needs a value: " + word + "=VALUE");
    }
    profile::Setting setting{key->name,
                             isSecret ? ReadSecret("Password") : text.substr(equals + 1)};
    CheckText(word, setting.value);
    if (setting.key == profile::kNumber) {
        CheckNumber(setting.value);
    } else if (setting.key == profile::kAPN) {
        CheckAPN(setting.value);
    } else if (setting.key == profile::kDefaultGateway) {
        setting.value = ReadSwitch(setting.value);
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

std::vector<std::string> ProfileSettingWords() {
    std::vector<std::string> words;
    for (const ProfileKey& key : kProfileKeys) {
        if (key.isStored) {
            words.push_back(Word(key) + (key.name == std::string(profile::kPassword) ? "" : "="));
        }
    }
    return words;
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
