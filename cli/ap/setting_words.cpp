// SPDX-License-Identifier: MIT
#include "cli/ap/setting_words.h"

#include "base/join.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "wireless/rules/ap_settings.h"
#include "wireless/rules/radio.h"

namespace taviwireless::cli {

namespace {

struct Kind {
    const char* word;
    int32_t security;
    int32_t wpaVersion;
};
constexpr Kind kKinds[] = {
    {"open", WIRELESS_AP_OPEN, 0},
    {"wep", WIRELESS_AP_WEP, 0},
    {"wpa", WIRELESS_AP_WPA, 1},
    {"wpa2", WIRELESS_AP_WPA, 2},
    {"wpa-mixed", WIRELESS_AP_WPA, 3},
    {"wpa-eap", WIRELESS_AP_WPA_ENTERPRISE, 1},
    {"wpa2-eap", WIRELESS_AP_WPA_ENTERPRISE, 2},
    {"wpa-mixed-eap", WIRELESS_AP_WPA_ENTERPRISE, 3},
};

struct Cipher {
    const char* word;
    int32_t cipher;
};
constexpr Cipher kCiphers[] = {{"tkip", WIRELESS_AP_TKIP},
                               {"aes", WIRELESS_AP_CCMP},
                               {"both", WIRELESS_AP_TKIP | WIRELESS_AP_CCMP}};

struct Mode {
    const char* word;
    int32_t band;
    int32_t ieee80211n;
    const char* inOtherBand;
};
// There is no "g": an access point that stations of 802.11g can use lets those of 802.11b in.
constexpr Mode kModes[] = {{"b", WIRELESS_AP_B, 0, "a"},    {"bg", WIRELESS_AP_G, 0, "a"},
                           {"bgn", WIRELESS_AP_G, 1, "an"}, {"n", WIRELESS_AP_N_ONLY, 1, "an"},
                           {"a", WIRELESS_AP_A, 0, "bg"},   {"an", WIRELESS_AP_A, 1, "bgn"}};

// The row of this word.
template <typename Row, size_t Count, typename Allowed>
const Row& Find(const Row (&rows)[Count], const std::string& word, const char* what,
                Allowed isAllowed) {
    std::string words;
    for (const Row& row : rows) {
        if (!isAllowed(row)) {
            continue;
        }
        if (word == row.word) {
            return row;
        }
        AddItem(words, row.word);
    }
    throw CommandError(
        kUsage, std::string(what) + " cannot be " + Printable(word) + "; it is one of " + words);
}

// Nulls where the security is not WPA, of either kind.
struct WPA {
    int32_t* version;
    int32_t* cipher;
};
WPA WPAOf(const APNetwork& network) {
    WirelessAPSecret& secret = network.secret;
    switch (network.security) {
        case WIRELESS_AP_WPA:
            return {&secret.wpa.wpaVersion, &secret.wpa.cipher};
        case WIRELESS_AP_WPA_ENTERPRISE:
            return {&secret.enterprise.wpaVersion, &secret.enterprise.cipher};
        default:
            return {};
    }
}

const Mode* ModeOf(const WirelessAPConf& conf) {
    for (const Mode& mode : kModes) {
        if (mode.band == wireless::BandInUse(conf) &&
            (mode.ieee80211n != 0) == wireless::Is80211n(conf)) {
            return &mode;
        }
    }
    return nullptr;
}

}  // namespace

APNetwork MainNetwork(WirelessAPConf& conf) {
    return {conf, conf.ssid, conf.hidden, conf.maxStations, conf.security, conf.secret, false};
}

APNetwork GuestNetwork(WirelessAPConf& conf) {
    return {conf,
            conf.guestSsid,
            conf.guestHidden,
            conf.guestMaxStations,
            conf.guestSecurity,
            conf.guestSecret,
            true};
}

std::string SecurityWord(const APNetwork& network) {
    const int32_t* version = WPAOf(network).version;
    for (const Kind& kind : kKinds) {
        if (kind.security == network.security && (!version || kind.wpaVersion == *version)) {
            return kind.word;
        }
    }
    return "";
}

void SetSecurityWord(APNetwork& network, const std::string& word) {
    const Kind& kind = Find(kKinds, word, "security", [&](const Kind& known) {
        return !network.isForGuests || known.security != WIRELESS_AP_WPA_ENTERPRISE;
    });
    if (kind.security != network.security) {
        network.security = kind.security;
        network.secret = {};
        wireless::VisitSecret(wireless::DefaultSetter(), "", kind.security, network.secret);
    }
    if (int32_t* version = WPAOf(network).version) {
        *version = kind.wpaVersion;
    }
}

std::string CipherWord(const APNetwork& network) {
    const int32_t* cipher = WPAOf(network).cipher;
    for (const Cipher& known : kCiphers) {
        if (cipher != nullptr && known.cipher == *cipher) {
            return known.word;
        }
    }
    return "";
}

void SetCipherWord(APNetwork& network, const std::string& word) {
    const Cipher& known = Find(kCiphers, word, "cipher", [](const Cipher&) { return true; });
    int32_t* cipher = WPAOf(network).cipher;
    if (cipher == nullptr) {
        throw CommandError(kUsage, "a cipher needs one of the kinds of security with wpa");
    }
    *cipher = known.cipher;
}

std::string ModeWord(const WirelessAPConf& conf) {
    const Mode* mode = ModeOf(conf);
    return mode == nullptr ? "" : mode->word;
}

void SetModeWord(APNetwork& network, const std::string& word) {
    const Mode& mode = Find(kModes, word, "mode", [](const Mode&) { return true; });
    network.conf.band = mode.band;
    network.conf.ieee80211n = mode.ieee80211n;
}

std::string BandWord(const WirelessAPConf& conf) {
    return wireless::BandInUse(conf) == WIRELESS_AP_A ? "5" : "2.4";
}

void SetBandWord(APNetwork& network, const std::string& word) {
    if (word != "2.4" && word != "5") {
        throw CommandError(kUsage, "band is 2.4 or 5 (GHz)");
    }
    if (word != BandWord(network.conf)) {
        const Mode* mode = ModeOf(network.conf);
        SetModeWord(network, mode != nullptr ? mode->inOtherBand : word == "5" ? "an" : "bgn");
    }
}

}  // namespace taviwireless::cli
