#include "cli/ap/ap_changes.h"

#include <arpa/inet.h>

#include <set>

#include "base/fixed_field.h"
#include "base/join.h"
#include "cli/adapter/credentials.h"
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

void SetPassphrase(APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WPA,
                    "a passphrase needs the security wpa, wpa2 or wpa-mixed");
    CheckKey(Security::kWPA, value);
    CopyField(network.secret.wpa.passphrase, value);
}

void SetWEPKey(APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WEP, "a WEP key needs the security wep");
    CheckKey(Security::kWEP, value);
    CopyField(network.secret.wepKey, value);
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

struct Setting {
    const char* key;
    bool isForGuests;
    bool isSecret;
    void (*set)(APNetwork&, const std::string&);
};
// In the order in which they are set: what a setting depends on stands above it.
constexpr Setting kSettings[] = {
    {"bridge", false, false, SetBridge},
    {"band", false, false, SetBandWord},
    {"mode", false, false, SetModeWord},
    {"channel", false, false, SetChannelWord},
    {"width", false, false, SetWidthWord},
    {"guest", false, false, SetGuest},
    {"ssid", false, false, SetSsid},
    {"hidden", false, false, SetHidden},
    {"max-stations", false, false, SetMaxStations},
    {"security", false, false, SetSecurityWord},
    {"cipher", false, false, SetCipherWord},
    {"passphrase", false, true, SetPassphrase},
    {"wep-key", false, true, SetWEPKey},
    {"radius-server", false, false, SetRadiusServer},
    {"radius-port", false, false, SetRadiusPort},
    {"radius-secret", false, true, SetRadiusSecret},
    {"guest-isolate", true, false, SetIsolate},
    {"guest-ssid", true, false, SetSsid},
    {"guest-hidden", true, false, SetHidden},
    {"guest-max-stations", true, false, SetMaxStations},
    {"guest-security", true, false, SetSecurityWord},
    {"guest-cipher", true, false, SetCipherWord},
    {"guest-passphrase", true, true, SetPassphrase},
    {"guest-wep-key", true, true, SetWEPKey},
};

const Setting& FindSetting(const std::string& key) {
    for (const Setting& setting : kSettings) {
        if (key == setting.key) {
            return setting;
        }
    }
    throw CommandError(kUsage, "an access point has no setting " + Printable(key) + "; there are " +
                                   APSettingNames());
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
            require(network.secret.wepKey, "wep-key");
            return CheckKey(Security::kWEP, network.secret.wepKey);
        case WIRELESS_AP_WPA:
            require(network.secret.wpa.passphrase, "passphrase");
            return CheckKey(Security::kWPA, network.secret.wpa.passphrase);
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

std::string APSettingNames() {
    std::string names;
    for (const Setting& setting : kSettings) {
        AddItem(names, setting.key);
    }
    return names;
}

std::vector<APChange> ReadAPChanges(const std::vector<std::string>& texts) {
    std::vector<APChange> changes;
    std::set<std::string> names;
    for (const std::string& text : texts) {
        const size_t equals = text.find('=');
        const std::string key = text.substr(0, equals);
        const bool isSecret = FindSetting(key).isSecret;
        CheckForm(key, isSecret, equals != std::string::npos);
        if (!names.insert(key).second) {
            throw CommandError(kUsage, key + " is given twice");
        }
        changes.push_back({key, isSecret ? "" : text.substr(equals + 1)});
    }
    for (APChange& change : changes) {
        if (FindSetting(change.key).isSecret) {
            change.value = ReadNewSecret("New " + change.key);
        }
    }
    return changes;
}

void ApplyAPChanges(const std::vector<APChange>& changes, WirelessAPConf& conf) {
    for (const Setting& setting : kSettings) {
        APNetwork network = setting.isForGuests ? GuestNetwork(conf) : MainNetwork(conf);
        for (const APChange& change : changes) {
            if (change.key == setting.key) {
                setting.set(network, change.value);
            }
        }
    }
    for (const APChange& change : changes) {
        if (change.key == "band" && change.value != BandWord(conf)) {
            throw CommandError(kUsage, "mode " + ModeWord(conf) + " is of the band " +
                                           BandWord(conf) + ", not " + change.value);
        }
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
