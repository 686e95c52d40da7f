// SPDX-License-Identifier: MIT
#include "cli/ap/ap_report.h"

#include "cli/ap/country.h"
#include "cli/ap/radio.h"
#include "cli/ap/setting_words.h"
#include "cli/terminal.h"
#include "wireless/rules/radio.h"

namespace taviwireless::cli {

namespace {

std::string YesNo(bool value) {
    return value ? "yes" : "no";
}

// The one secret that the network's security has.
struct Secret {
    const char* key;
    const char* title;
    const char* text;
};
Secret SecretOf(const APNetwork& network) {
    switch (network.security) {
        case WIRELESS_AP_WEP:
            return {"key", "Key", network.secret.wepKey};
        case WIRELESS_AP_WPA:
            return {"key", "Key", network.secret.wpa.passphrase};
        case WIRELESS_AP_WPA_ENTERPRISE:
            return {"radius_secret", "RADIUS secret", network.secret.enterprise.radiusSecret};
        default:
            return {nullptr, nullptr, ""};
    }
}

void AddFlag(Report& report, const char* key, const char* title, bool value) {
    report.Add(key, title, value, YesNo(value));
}

void AddLimit(Report& report, int32_t maxStations) {
    const bool isLimited = maxStations > 0;
    report.Add("max_stations", "Stations at most",
               isLimited ? Json::Value(maxStations) : Json::Value(),
               isLimited ? std::to_string(maxStations) : "-");
}

void AddNetwork(Report& report, const APNetwork& network, bool showSecrets) {
    const std::string security = SecurityWord(network);
    const std::string cipher = CipherWord(network);
    report.Add("ssid", "Network", network.ssid);
    AddFlag(report, "hidden", "Hidden", network.hidden != 0);
    AddLimit(report, network.maxStations);
    report.Add("security", "Security", TextOrNull(security),
               Cell(security) + (cipher.empty() ? "" : ", cipher " + cipher));
    report.document["cipher"] = TextOrNull(cipher);
    const Secret secret = SecretOf(network);
    for (const char* key : {"key", "radius_server", "radius_port", "radius_secret"}) {
        if (!network.isForGuests || key == std::string("key")) {
            report.document[key] = Json::Value();
        }
    }
    if (secret.key != nullptr) {
        report.Add(secret.key, secret.title, SecretText(secret.text, showSecrets));
    }
    if (network.security == WIRELESS_AP_WPA_ENTERPRISE) {
        const auto& radius = network.secret.enterprise;
        report.Add("radius_server", "RADIUS server", TextOrNull(radius.radiusAddr),
                   Cell(radius.radiusAddr) + ", port " + std::to_string(radius.radiusPort));
        report.document["radius_port"] = radius.radiusPort;
    }
}

struct State {
    const char* word;
    const char* text;
};
State StateOf(const APStatus& status) {
    if (status.isConnecting) {
        return {"connecting", "being switched on"};
    }
    if (status.isOn) {
        return {"on", "on"};
    }
    return status.isSupported
               ? State{"off", "off"}
               : State{"not_supported", "the adapter, if there is one, cannot be an access point"};
}

// Rows only while there is a network for guests.
Report DescribeGuests(WirelessAPConf& ap, bool showSecrets) {
    Report report;
    AddNetwork(report, GuestNetwork(ap), showSecrets);
    AddFlag(report, "isolate", "Isolated", ap.guestIsolate != 0);
    report.document["enabled"] = ap.guestEnabled != 0;
    if (ap.guestEnabled == 0) {
        report.rows.clear();
    }
    return report;
}

}  // namespace

Report Describe(const APStatus& status) {
    const std::string interface = TAVIWirelessAPInterfaceGet();
    Report report;
    report.Add("interface", "Interface", interface, interface);
    const State state = StateOf(status);
    report.Add("state", "State", state.word, state.text);
    if (!status.settings) {
        for (const char* key : {"enabled", "ssid", "bridge", "address", "max_stations"}) {
            report.document[key] = Json::Value();
        }
        return report;
    }
    const WirelessAPConf& ap = status.settings->ap;
    AddFlag(report, "enabled", "To be on", status.settings->enabled != 0);
    report.Add("ssid", "Network", ap.ssid);
    report.Add("bridge", "Bridge", ap.bridge);
    report.Add("address", "Address", status.bridgeAddress);
    AddLimit(report, ap.maxStations);
    return report;
}

Report DescribeSwitchedOn(const Switched& switched, WirelessAPConf conf) {
    const APNetwork network = MainNetwork(conf);
    const bool isOpen = network.security == WIRELESS_AP_OPEN;
    Report report = Describe(LookAtAP());
    std::string sentence =
        TAVIWirelessAPInterfaceGet() + (": access point " + Printable(conf.ssid)) +
        (switched.wasOn ? " is on already, " : " switched on, ") +
        (isOpen ? "open: everybody can join" : "security " + SecurityWord(network));
    report.document["remark"] = TextOrNull(switched.remark);
    sentence += (switched.remark.empty() ? "" : "; ") + switched.remark;
    report.rows = {{sentence}};
    return report;
}

Report Describe(WirelessAPSettings settings, bool showSecrets) {
    WirelessAPConf& ap = settings.ap;
    const std::string band = BandWord(ap);
    const std::string mode = ModeWord(ap);
    const int width = ChannelWidth(ap);
    Report report;
    report.Add("adapter", "Adapter", settings.name);
    AddFlag(report, "enabled", "To be on", settings.enabled != 0);
    AddNetwork(report, MainNetwork(ap), showSecrets);
    report.Add("bridge", "Bridge", ap.bridge);
    report.Add("country", "Country", StoredCountry());
    report.Add("mode", "Mode", TextOrNull(mode), "802.11" + Cell(mode) + " at " + band + " GHz");
    report.document["band"] = band;
    report.Add("channel", "Channel",
               ap.channel == wireless::kAnyChannel ? Json::Value() : Json::Value(ap.channel),
               ChannelWord(ap) + ", " + std::to_string(width) + " MHz");
    report.document["width"] = width;
    report.rows.push_back({"Guest network", YesNo(ap.guestEnabled != 0)});
    report.AddPart("guest", "Guests: ", DescribeGuests(ap, showSecrets));
    return report;
}

}  // namespace taviwireless::cli
