// SPDX-License-Identifier: MIT
#include "cli/ap/ap_changes.h"

#include <arpa/inet.h>

#include <algorithm>
#include <set>

#include "base/fixed_field.h"
#include "base/split.h"
#include "cli/adapter/credentials.h"
#include "cli/ap/country.h"
#include "cli/ap/radio.h"
#include "cli/ap/setting_words.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "wireless/system/bridge.h"

namespace taviwireless::cli {

namespace {

// Whether the text can stand in a line of a file.
bool IsPrintable(const std::string& text) {
    return Printable(text) == text;
}

bool ParseYesNo(const std::string& value, const char* what) {
    if (value != "yes" && value != "no") {
        throw CommandError(kUsage, std::string(what) + " is yes or no");
    }
    return value == "yes";
}

int ParseNumber(const std::string& value, int last, const char* what) {
    const bool isNumber = !value.empty() && value.size() <= 5 &&
                          value.find_first_not_of("0123456789") == std::string::npos;
    const int number = isNumber ? std::stoi(value) : 0;
    if (number < 1 || number > last) {
        throw CommandError(kUsage,
                           std::string(what) + " is a number from 1 to " + std::to_string(last));
    }
    return number;
}

void CheckBridge(const std::string& bridge) {
    if (const std::string reason = wireless::WhyNoBridge(bridge); !reason.empty()) {
        throw CommandError(kUsage, "bridge " + reason);
    }
}

void SetBridge(APNetwork& network, const std::string& value) {
    CheckBridge(value);
    CopyField(network.conf.bridge, value);
}

void SetGuest(APNetwork& network, const std::string& value) {
    network.conf.guestEnabled = ParseYesNo(value, "guest");
}

void SetIsolate(APNetwork& network, const std::string& value) {
    network.conf.guestIsolate = ParseYesNo(value, "guest-isolate");
}

void SetSsid(APNetwork& network, const std::string& value) {
    CheckEssid(value);
    CopyField(network.ssid, value);
}

void SetHidden(APNetwork& network, const std::string& value) {
    network.hidden = ParseYesNo(value, "hidden");
}

void SetMaxStations(APNetwork& network, const std::string& value) {
    constexpr int kMostStations = 2007;  // of the numbers that a station may get
    network.maxStations = ParseNumber(value, kMostStations, "max-stations");
}

void RequireSecurity(const APNetwork& network, int security, const char* sentence) {
    if (network.security != security) {
        throw CommandError(kUsage, sentence);
    }
}

// hostapd takes 64 hexadecimal digits for no passphrase; a station would.
void CheckWPAKey(const std::string& key) {
    CheckKey(Security::kWPA, key.substr(0, WIRELESS_AP_PASSPHRASE_SIZE));
    if (key.size() > 63) {
        throw CommandError(kUsage, "the key of an access point has at most 63 characters");
    }
}

void SetKey(APNetwork& network, const std::string& value) {
    if (network.security == WIRELESS_AP_WEP) {
        CheckKey(Security::kWEP, value);
        CopyField(network.secret.wepKey, value);
        return;
    }
    RequireSecurity(network, WIRELESS_AP_WPA,
                    "a key needs the security wep, wpa, wpa2 or wpa-mixed");
    CheckWPAKey(value);
    CopyField(network.secret.wpa.passphrase, value);
}

constexpr char kNeedsEAP[] =
    "a RADIUS server needs the security wpa-eap, wpa2-eap or wpa-mixed-eap";

void SetRadiusServer(APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WPA_ENTERPRISE, kNeedsEAP);
    in_addr address{};
    if (inet_pton(AF_INET, value.c_str(), &address) != 1) {
        throw CommandError(kUsage, "radius-server is an IPv4 address");
    }
    CopyField(network.secret.enterprise.radiusAddr, value);
}

void SetRadiusPort(APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WPA_ENTERPRISE, kNeedsEAP);
    network.secret.enterprise.radiusPort = ParseNumber(value, 65535, "radius-port");
}

void SetRadiusSecret(APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WPA_ENTERPRISE, kNeedsEAP);
    if (value.empty() || value.size() >= WIRELESS_AP_PASSPHRASE_SIZE || !IsPrintable(value)) {
        throw CommandError(kUsage, "radius-secret has 1 to 255 printable characters");
    }
    CopyField(network.secret.enterprise.radiusSecret, value);
}

// Stored apart from the others, of which none depends on it.
void CheckCountry(APNetwork&, const std::string& value) {
    CountryOf(value);
}

struct Setting {
    const char* key;
    bool isForGuests;
    void (*set)(APNetwork&, const std::string&);
    const char* values;  // nullptr: a secret
};
// In the order in which they are set: what a setting depends on stands above it.
constexpr Setting kSettings[] = {
    {"country", false, CheckCountry, "where it is: DE, US ... (ISO 3166), or none"},
    {"bridge", false, SetBridge, "lbr0 (a network of its own), or the bridge to join"},
    {"band", false, SetBandWord, "2.4 or 5 (GHz)"},
    {"mode", false, SetModeWord, "b, bg, bgn, n; a, an at 5 GHz"},
    {"channel", false, SetChannelWord, "a number, or auto: the emptiest one now"},
    {"width", false, SetWidthWord, "20 or 40 (MHz)"},
    {"guest", false, SetGuest, "yes or no: a second network, for guests"},
    {"ssid", false, SetSsid, "the name of the network, 1 to 32 bytes"},
    {"hidden", false, SetHidden, "yes or no"},
    {"max-stations", false, SetMaxStations, "1 to 2007"},
    {"security", false, SetSecurityWord,
     "open, wep, wpa, wpa2, wpa-mixed,\n"
     "wpa-eap, wpa2-eap or wpa-mixed-eap"},
    {"cipher", false, SetCipherWord, "tkip, aes or both (of WPA)"},
    {"key", false, SetKey, nullptr},
    {"radius-server", false, SetRadiusServer, "an IPv4 address"},
    {"radius-port", false, SetRadiusPort, "1 to 65535"},
    {"radius-secret", false, SetRadiusSecret, nullptr},
    {"guest-isolate", true, SetIsolate, "yes or no: guests do not reach each other"},
    {"guest-ssid", true, SetSsid, "as ssid"},
    {"guest-hidden", true, SetHidden, "yes or no"},
    {"guest-max-stations", true, SetMaxStations, "1 to 2007"},
    {"guest-security", true, SetSecurityWord, "open, wep, wpa, wpa2 or wpa-mixed"},
    {"guest-cipher", true, SetCipherWord, "tkip, aes or both (of WPA)"},
    {"guest-key", true, SetKey, nullptr},
};

bool IsSecret(const Setting& setting) {
    return setting.values == nullptr;
}

const Setting& FindSetting(const std::string& key) {
    for (const Setting& setting : kSettings) {
        if (key == setting.key) {
            return setting;
        }
    }
    throw CommandError(kUsage, "an access point has no setting " + Printable(key) +
                                   "; taviwireless ap set --help lists those there are");
}

void CheckForm(const std::string& key, bool isSecret, bool hasValue) {
    if (isSecret && hasValue) {
        throw CommandError(kUsage, key +
                                       " is read from standard input, where nobody else "
                                       "sees it; give it without a value");
    }
    if (!isSecret && !hasValue) {
        throw CommandError(kUsage, key + " needs a value: " + key + "=VALUE");
    }
}

void CheckSecret(const APNetwork& network) {
    const std::string prefix = network.isForGuests ? "guest-" : "";
    const auto require = [&](const char* text, const char* key) {
        if (text[0] == '\0') {
            throw CommandError(
                kUsage, prefix + "security " + SecurityWord(network) + " needs " + prefix + key);
        }
    };
    switch (network.security) {
        case WIRELESS_AP_WEP:
            require(network.secret.wepKey, "key");
            return CheckKey(Security::kWEP, network.secret.wepKey);
        case WIRELESS_AP_WPA:
            require(network.secret.wpa.passphrase, "key");
            return CheckWPAKey(network.secret.wpa.passphrase);
        case WIRELESS_AP_WPA_ENTERPRISE:
            require(network.secret.enterprise.radiusAddr, "radius-server");
            return require(network.secret.enterprise.radiusSecret, "radius-secret");
        default:
            return;
    }
}

void CheckNetwork(const APNetwork& network) {
    CheckEssid(network.ssid);
    if (SecurityWord(network).empty()) {
        throw CommandError(kUsage, "the stored security is none that is known here; set security");
    }
    CheckSecret(network);
}

}  // namespace

std::string APSettingsHelp() {
    constexpr int kColumn = 22;
    std::string help = "Settings:";
    for (const Setting& setting : kSettings) {
        std::string key = setting.key;
        const char* values = IsSecret(setting) ? "read from standard input" : setting.values;
        for (const std::string& line : Split(values, '\n')) {
            help += "\n  " + key + std::string(kColumn - key.size(), ' ') + line;
            key.clear();
        }
    }
    return help;
}

std::vector<std::string> APSettingWords() {
    std::vector<std::string> words;
    for (const Setting& setting : kSettings) {
        words.push_back(setting.key + std::string(IsSecret(setting) ? "" : "="));
    }
    return words;
}

const APChange* FindChange(const std::vector<APChange>& changes, const std::string& key) {
    const auto found = std::find_if(changes.begin(), changes.end(),
                                    [&](const APChange& change) { return change.key == key; });
    return found == changes.end() ? nullptr : &*found;
}

std::vector<APChange> ReadAPChanges(const std::vector<std::string>& texts) {
    std::vector<APChange> changes;
    std::set<std::string> names;
    for (const std::string& text : texts) {
        const size_t equals = text.find('=');
        const std::string key = text.substr(0, equals);
        const bool isSecret = IsSecret(FindSetting(key));
        CheckForm(key, isSecret, equals != std::string::npos);
        if (!names.insert(key).second) {
            throw CommandError(kUsage, key + " is given twice");
        }
        changes.push_back({key, isSecret ? "" : text.substr(equals + 1)});
    }
    for (APChange& change : changes) {
        if (IsSecret(FindSetting(change.key))) {
            change.value = ReadNewSecret("New " + change.key);
        }
    }
    return changes;
}

void ApplyAPChanges(const std::vector<APChange>& changes, WirelessAPConf& conf) {
    for (const Setting& setting : kSettings) {
        APNetwork network = setting.isForGuests ? GuestNetwork(conf) : MainNetwork(conf);
        if (const APChange* change = FindChange(changes, setting.key)) {
            setting.set(network, change->value);
        }
    }
    const APChange* band = FindChange(changes, "band");
    if (band != nullptr && band->value != BandWord(conf)) {
        throw CommandError(kUsage, "mode " + ModeWord(conf) + " is of the band " + BandWord(conf) +
                                       ", not " + band->value);
    }
}

void CheckAPConf(WirelessAPConf conf) {
    CheckBridge(conf.bridge);
    const APNetwork network = MainNetwork(conf);
    CheckNetwork(network);
    CheckRadio(conf);
    const bool is80211nOnly = ModeWord(conf) == "n";
    if (is80211nOnly && (network.security == WIRELESS_AP_WEP || CipherWord(network) == "tkip")) {
        throw CommandError(kUsage, "mode n carries neither WEP nor TKIP alone; mode bgn does");
    }
    if (conf.guestEnabled != 0) {
        CheckNetwork(GuestNetwork(conf));
    }
}

}  // namespace taviwireless::cli
