#include "cli/ap/ap_report.h"

#include <json/json.h>

#include "cli/ap/radio.h"
#include "cli/ap/setting_words.h"
#include "cli/wifi/station.h"
#include "cli/wifi/wifi_report.h"

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
            return {"wep_key", "WEP key", network.secret.wepKey};
        case WIRELESS_AP_WPA:
            return {"passphrase", "Passphrase", network.secret.wpa.passphrase};
        case WIRELESS_AP_WPA_ENTERPRISE:
            return {"radius_secret", "RADIUS secret", network.secret.enterprise.radiusSecret};
        default:
            return {nullptr, nullptr, ""};
    }
}

bool HasRadius(const APNetwork& network) {
    return network.security == WIRELESS_AP_WPA_ENTERPRISE;
}

Json::Value LimitOrNull(int32_t maxStations) {
    return maxStations > 0 ? Json::Value(maxStations) : Json::Value();
}

std::string LimitCell(int32_t maxStations) {
    return maxStations > 0 ? std::to_string(maxStations) : "-";
}

void AddNetwork(Json::Value& document, const APNetwork& network, bool showSecrets) {
    document["ssid"] = TextOrNull(network.ssid);
    document["hidden"] = network.hidden != 0;
    document["max_stations"] = LimitOrNull(network.maxStations);
    document["security"] = TextOrNull(SecurityWord(network));
    document["cipher"] = TextOrNull(CipherWord(network));
    const Secret secret = SecretOf(network);
    if (secret.key != nullptr) {
        document[secret.key] = TextOrNull(SecretText(secret.text, showSecrets));
    }
    if (HasRadius(network)) {
        document["radius_server"] = TextOrNull(network.secret.enterprise.radiusAddr);
        document["radius_port"] = network.secret.enterprise.radiusPort;
    }
}

void AddNetwork(Table& table, const APNetwork& network, bool showSecrets) {
    const std::string prefix = network.isForGuests ? "Guests: " : "";
    const auto add = [&](const char* title, const std::string& cell) {
        table.push_back({prefix + title, cell});
    };
    const std::string cipher = CipherWord(network);
    add("Network", Cell(network.ssid));
    add("Hidden", YesNo(network.hidden != 0));
    add("Stations at most", LimitCell(network.maxStations));
    add("Security", Cell(SecurityWord(network)) + (cipher.empty() ? "" : ", cipher " + cipher));
    const Secret secret = SecretOf(network);
    if (secret.key != nullptr) {
        add(secret.title, Cell(SecretText(secret.text, showSecrets)));
    }
    if (HasRadius(network)) {
        const auto& radius = network.secret.enterprise;
        add("RADIUS server",
            Cell(radius.radiusAddr) + ", port " + std::to_string(radius.radiusPort));
    }
}

const char* StateText(const APStatus& status) {
    if (status.isConnecting) {
        return "being switched on";
    }
    if (status.isOn) {
        return "on";
    }
    return status.isSupported ? "off" : "the adapter, if there is one, cannot be an access point";
}

}  // namespace

Json::Value ToJson(const APStatus& status) {
    Json::Value document;
    document["interface"] = TAVIWirelessAPInterfaceGet();
    document["supported"] = status.isSupported;
    document["connecting"] = status.isConnecting;
    document["on"] = status.isOn;
    for (const char* key : {"enabled", "ssid", "bridge", "max_stations"}) {
        document[key] = Json::Value();
    }
    if (status.settings) {
        const WirelessAPConf& ap = status.settings->ap;
        document["enabled"] = status.settings->enabled != 0;
        document["ssid"] = TextOrNull(ap.ssid);
        document["bridge"] = TextOrNull(ap.bridge);
        document["max_stations"] = LimitOrNull(ap.maxStations);
    }
    document["address"] = TextOrNull(status.bridgeAddress);
    return document;
}

Table StatusTable(const APStatus& status) {
    Table table{{"Interface", TAVIWirelessAPInterfaceGet()}, {"State", StateText(status)}};
    if (status.settings) {
        const WirelessAPConf& ap = status.settings->ap;
        table.push_back({"To be on", YesNo(status.settings->enabled != 0)});
        table.push_back({"Network", Cell(ap.ssid)});
        table.push_back({"Bridge", Cell(ap.bridge)});
        table.push_back({"Address", Cell(status.bridgeAddress)});
        table.push_back({"Stations at most", LimitCell(ap.maxStations)});
    }
    return table;
}

Json::Value ToJson(WirelessAPSettings settings, bool showSecrets) {
    WirelessAPConf& ap = settings.ap;
    Json::Value document;
    document["adapter"] = TextOrNull(settings.name);
    document["enabled"] = settings.enabled != 0;
    AddNetwork(document, MainNetwork(ap), showSecrets);
    document["bridge"] = TextOrNull(ap.bridge);
    document["mode"] = TextOrNull(ModeWord(ap));
    document["band"] = BandWord(ap);
    document["channel"] = ap.channel == 0 ? Json::Value("auto") : Json::Value(ap.channel);
    document["width"] = ChannelWidth(ap);
    Json::Value& guest = document["guest"];
    guest["enabled"] = ap.guestEnabled != 0;
    AddNetwork(guest, GuestNetwork(ap), showSecrets);
    guest["isolate"] = ap.guestIsolate != 0;
    return document;
}

Table ShowTable(WirelessAPSettings settings, bool showSecrets) {
    WirelessAPConf& ap = settings.ap;
    Table table{{"Adapter", Cell(settings.name)}, {"To be on", YesNo(settings.enabled != 0)}};
    AddNetwork(table, MainNetwork(ap), showSecrets);
    table.push_back({"Bridge", Cell(ap.bridge)});
    table.push_back({"Mode", "802.11" + Cell(ModeWord(ap)) + " at " + BandWord(ap) + " GHz"});
    table.push_back(
        {"Channel", ChannelWord(ap) + ", " + std::to_string(ChannelWidth(ap)) + " MHz"});
    table.push_back({"Guest network", YesNo(ap.guestEnabled != 0)});
    if (ap.guestEnabled != 0) {
        AddNetwork(table, GuestNetwork(ap), showSecrets);
        table.push_back({"Guests: Isolated", YesNo(ap.guestIsolate != 0)});
    }
    return table;
}

}  // namespace taviwireless::cli
