#include "cli/ap/ap_changes.h"

#include <arpa/inet.h>

#include <algorithm>
#include <set>

#include "base/join.h"
#include "cli/adapter/credentials.h"
#include "cli/ap/radio.h"
#include "cli/ap/setting_words.h"
#include "cli/command_line.h"
#include "cli/prompt.h"
#include "cli/report.h"
#include "cli/wifi/station.h"
#include "wireless/rules/bridge_name.h"

namespace taviwireless::cli {

namespace {

constexpr char kForGuests[] = "guest-";

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

void SetBridge(WirelessAPConf& conf, APNetwork&, const std::string& value) {
    CheckBridge(value);
    SetField(conf.bridge, value);
}

void SetBand(WirelessAPConf& conf, APNetwork&, const std::string& value) {
    SetBandWord(conf, value);
}

void SetMode(WirelessAPConf& conf, APNetwork&, const std::string& value) {
    SetModeWord(conf, value);
}

void SetChannel(WirelessAPConf& conf, APNetwork&, const std::string& value) {
    SetChannelWord(conf, value);
}

void SetWidth(WirelessAPConf& conf, APNetwork&, const std::string& value) {
    SetWidthWord(conf, value);
}

void SetGuest(WirelessAPConf& conf, APNetwork&, const std::string& value) {
    conf.guestEnabled = ParseYesNo(value, "guest");
}

void SetIsolate(WirelessAPConf& conf, APNetwork&, const std::string& value) {
    conf.guestIsolate = ParseYesNo(value, "guest-isolate");
}

void SetSsid(WirelessAPConf&, APNetwork& network, const std::string& value) {
    CheckEssid(value);
    SetField(network.ssid, value);
}

void SetHidden(WirelessAPConf&, APNetwork& network, const std::string& value) {
    network.hidden = ParseYesNo(value, "hidden");
}

void SetMaxStations(WirelessAPConf&, APNetwork& network, const std::string& value) {
    constexpr int kMostStations = 2007;  // of the numbers that a station may get
    network.maxStations = ParseNumber(value, kMostStations, "max-stations");
}

void SetNetworkSecurity(WirelessAPConf&, APNetwork& network, const std::string& value) {
    SetSecurityWord(network, value);
}

void SetCipher(WirelessAPConf&, APNetwork& network, const std::string& value) {
    SetCipherWord(network, value);
}

void RequireSecurity(const APNetwork& network, int security, const char* sentence) {
    if (network.security != security) {
        throw CommandError(kUsage, sentence);
    }
}

void SetPassphrase(WirelessAPConf&, APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WPA,
                    "a passphrase needs the security wpa, wpa2 or wpa-mixed");
    CheckKey(Security::kWPA, value);
    SetField(network.secret.wpa.passphrase, value);
}

void SetWEPKey(WirelessAPConf&, APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WEP, "a WEP key needs the security wep");
    CheckKey(Security::kWEP, value);
    SetField(network.secret.wepKey, value);
}

constexpr char kNeedsEAP[] =
    "a RADIUS server needs the security wpa-eap, wpa2-eap or wpa-mixed-eap";

void SetRadiusServer(WirelessAPConf&, APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WPA_ENTERPRISE, kNeedsEAP);
    in_addr address{};
    if (inet_pton(AF_INET, value.c_str(), &address) != 1) {
        throw CommandError(kUsage, "radius-server is an IPv4 address");
    }
    SetField(network.secret.enterprise.radiusAddr, value);
}

void SetRadiusPort(WirelessAPConf&, APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WPA_ENTERPRISE, kNeedsEAP);
    network.secret.enterprise.radiusPort = ParseNumber(value, 65535, "radius-port");
}

void SetRadiusSecret(WirelessAPConf&, APNetwork& network, const std::string& value) {
    RequireSecurity(network, WIRELESS_AP_WPA_ENTERPRISE, kNeedsEAP);
    if (value.empty() || value.size() >= WIRELESS_AP_PASSPHRASE_SIZE || !IsPrintable(value)) {
        throw CommandError(kUsage, "radius-secret has 1 to 255 printable characters");
    }
    SetField(network.secret.enterprise.radiusSecret, value);
}

enum class Scope { kMain, kGuests, kBoth };

struct Setting {
    const char* key;
    Scope scope;
    bool isSecret;
    void (*set)(WirelessAPConf&, APNetwork&, const std::string&);
};
// In the order in which they are set: what a setting depends on stands above it.
constexpr Setting kSettings[] = {
    {"bridge", Scope::kMain, false, SetBridge},
    {"band", Scope::kMain, false, SetBand},
    {"mode", Scope::kMain, false, SetMode},
    {"channel", Scope::kMain, false, SetChannel},
    {"width", Scope::kMain, false, SetWidth},
    {"guest", Scope::kMain, false, SetGuest},
    {"isolate", Scope::kGuests, false, SetIsolate},
    {"ssid", Scope::kBoth, false, SetSsid},
    {"hidden", Scope::kBoth, false, SetHidden},
    {"max-stations", Scope::kBoth, false, SetMaxStations},
    {"security", Scope::kBoth, false, SetNetworkSecurity},
    {"cipher", Scope::kBoth, false, SetCipher},
    {"passphrase", Scope::kBoth, true, SetPassphrase},
    {"wep-key", Scope::kBoth, true, SetWEPKey},
    {"radius-server", Scope::kMain, false, SetRadiusServer},
    {"radius-port", Scope::kMain, false, SetRadiusPort},
    {"radius-secret", Scope::kMain, true, SetRadiusSecret},
};

struct Key {
    std::string name;
    const Setting* setting;
    bool isForGuests;
};

const std::vector<Key>& Keys() {
    static const std::vector<Key> keys = [] {
        std::vector<Key> all;
        for (const Setting& setting : kSettings) {
            if (setting.scope != Scope::kGuests) {
                all.push_back({setting.key, &setting, false});
            }
        }
        for (const Setting& setting : kSettings) {
            if (setting.scope != Scope::kMain) {
                all.push_back({std::string(kForGuests) + setting.key, &setting, true});
            }
        }
        return all;
    }();
    return keys;
}

const Key& FindKey(const std::string& name) {
    const auto found = std::find_if(Keys().begin(), Keys().end(),
                                    [&](const Key& key) { return key.name == name; });
    if (found == Keys().end()) {
        throw CommandError(kUsage, "an access point has no setting " + Printable(name) +
                                       "; there are " + APSettingNames());
    }
    return *found;
}

void CheckForm(const Key& key, bool hasValue) {
    if (key.setting->isSecret && hasValue) {
        throw CommandError(kUsage, key.name +
                                       " is read from standard input, where nobody else "
                                       "sees it; give it without a value");
    }
    if (!key.setting->isSecret && !hasValue) {
        throw CommandError(kUsage, key.name + " needs a value: " + key.name + "=VALUE");
    }
}

void CheckSecret(const APNetwork& network) {
    const std::string prefix = network.isForGuests ? kForGuests : "";
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
    for (const Key& key : Keys()) {
        AddItem(names, key.name);
    }
    return names;
}

std::vector<APChange> ReadAPChanges(const std::vector<std::string>& texts) {
    std::vector<APChange> changes;
    std::set<std::string> names;
    for (const std::string& text : texts) {
        const size_t equals = text.find('=');
        const Key& key = FindKey(text.substr(0, equals));
        CheckForm(key, equals != std::string::npos);
        if (!names.insert(key.name).second) {
            throw CommandError(kUsage, key.name + " is given twice");
        }
        changes.push_back({key.name, key.setting->isSecret ? "" : text.substr(equals + 1)});
    }
    for (APChange& change : changes) {
        if (FindKey(change.key).setting->isSecret) {
            change.value = ReadNewSecret("New " + change.key);
        }
    }
    return changes;
}

void ApplyAPChanges(const std::vector<APChange>& changes, WirelessAPConf& conf) {
    for (const Key& key : Keys()) {
        APNetwork network = key.isForGuests ? GuestNetwork(conf) : MainNetwork(conf);
        for (const APChange& change : changes) {
            if (change.key == key.name) {
                key.setting->set(conf, network, change.value);
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
