#include "cli/wifi/wifi_report.h"

#include <json/json.h>

#include <algorithm>
#include <ctime>

#include "cli/adapter/credentials.h"
#include "cli/wifi/station.h"

namespace taviwireless::cli {

namespace {

struct StatusWord {
    const char* word;
    const char* text;
};
// The index is WIRELESS_STATUS_...
constexpr StatusWord kStatuses[] = {{"other_mode", "in a mode that is not used here"},
                                    {"not_supported", "this model does not support Wi-Fi"},
                                    {"no_adapter", "there is no Wi-Fi adapter"},
                                    {"interface_down", "the interface is down"},
                                    {"not_connected", "not connected"},
                                    {"connected", "connected"},
                                    {"adhoc", "in an ad-hoc network"},
                                    {"master", "an access point or a monitor"}};

const StatusWord& WordsOf(const WirelessStatus& status) {
    const bool isKnown =
        status.status >= 0 && static_cast<size_t>(status.status) < std::size(kStatuses);
    return kStatuses[isKnown ? status.status : WIRELESS_STATUS_OTHER_MODE];
}

Json::Value NumberOrNull(int number) {
    return number == 0 ? Json::Value() : Json::Value(number);
}

std::string ProtocolText(const WirelessNetwork& network) {
    return network.protocol == WIRELESS_PROTOCOL_UNKNOWN
               ? ""
               : TAVIWirelessProtocolStringGet(network.protocol);
}

std::string AuthText(const WirelessNetwork& network) {
    return network.auth == WIRELESS_AUTH_UNKNOWN ? "" : TAVIWirelessAuthStringGet(network.auth);
}

std::string EncryptText(const WirelessNetwork& network) {
    return network.encrypt == WIRELESS_ENCRYPT_UNKNOWN
               ? ""
               : TAVIWirelessEncryptStringGet(network.encrypt, 0);
}

// "[###-] 70%"
std::string SignalCell(int percent) {
    constexpr int kBars = 4;
    if (percent == 0) {
        return "-";
    }
    const int known = std::clamp(percent, 0, 100);
    const auto full = static_cast<size_t>((known * kBars + 99) / 100);
    return "[" + std::string(full, '#') + std::string(kBars - full, '-') + "] " +
           std::to_string(percent) + "%";
}

std::string ChannelCell(const WirelessNetwork& network) {
    return network.channel == 0 ? "-" : std::to_string(network.channel);
}

std::string TimeText(int32_t seconds) {
    const time_t moment = seconds;
    tm local{};
    char text[32];
    if (seconds == 0 || localtime_r(&moment, &local) == nullptr ||
        strftime(text, sizeof text, "%Y-%m-%d %H:%M", &local) == 0) {
        return "";
    }
    return text;
}

std::string AddressText(const WirelessConf& conf) {
    return IsDHCP(conf) ? "by DHCP" : conf.ipAddr;
}

std::string StatusLine(const WirelessStatus& status, const std::string& address) {
    std::string line = WifiInterface() + ": " + WordsOf(status).text;
    const std::string essid = status.network.essid;
    if (IsInNetwork(status.status) && !essid.empty()) {
        line += (status.status == WIRELESS_STATUS_CONNECTED ? " to " : ", ") + essid;
        line += address.empty() ? "" : ", " + address;
    }
    return Printable(line);
}

}  // namespace

std::string BssidText(const unsigned char (&bssid)[6]) {
    const bool isKnown = std::any_of(std::begin(bssid), std::end(bssid), [](int b) { return b; });
    char text[18];
    return isKnown ? TAVIWirelessBssidStringGet(bssid, text, sizeof text) : "";
}

std::string SecurityText(const WirelessNetwork& network) {
    switch (SecurityOf(network)) {
        case Security::kOpen:
            return "open";
        case Security::kWEP:
            return "WEP";
        case Security::kUnknown:
            return "";
        default:
            break;
    }
    const std::string cipher = EncryptText(network);
    return AuthText(network) + (cipher.empty() ? "" : "/" + cipher);
}

Json::Value ToJson(const WirelessNetwork& network) {
    Json::Value document;
    document["essid"] = TextOrNull(network.essid);
    document["bssid"] = TextOrNull(BssidText(network.bssid));
    document["channel"] = NumberOrNull(network.channel);
    document["signal"] = NumberOrNull(network.signal);
    document["protocol"] = TextOrNull(ProtocolText(network));
    document["auth"] = TextOrNull(AuthText(network));
    document["encrypt"] = TextOrNull(EncryptText(network));
    return document;
}

Json::Value ToJson(const std::vector<WirelessNetwork>& networks) {
    Json::Value documents(Json::arrayValue);
    for (const WirelessNetwork& network : networks) {
        documents.append(ToJson(network));
    }
    return documents;
}

std::string ListText(const std::vector<WirelessNetwork>& networks) {
    if (networks.empty()) {
        return "No network is in range.\n";
    }
    Table table{{"NETWORK", "SIGNAL", "SECURITY", "CHANNEL", "BSSID"}};
    for (const WirelessNetwork& network : networks) {
        const std::string essid = network.essid;
        table.push_back({essid.empty() ? "(hidden)" : Printable(essid), SignalCell(network.signal),
                         Cell(SecurityText(network)), ChannelCell(network),
                         BssidText(network.bssid)});
    }
    return ToText(table);
}

Json::Value ToJson(const WirelessStatus& status, const std::string& address) {
    Json::Value document = ToJson(status.network);
    document["interface"] = TextOrNull(WifiInterface());
    document["status"] = WordsOf(status).word;
    document["ip"] = TextOrNull(address);
    return document;
}

void ReportWifi(const Options& options) {
    const WirelessStatus status = LookAtWifi();
    const std::string address = WifiAddress();
    options.json ? Print(ToJson(status, address)) : Print(Table{{StatusLine(status, address)}});
}

Table StatusTable(const WirelessStatus& status, const std::string& address) {
    Table table{{"Interface", Cell(WifiInterface())}, {"State", WordsOf(status).text}};
    if (IsInNetwork(status.status)) {
        const WirelessNetwork& network = status.network;
        table.push_back({"Network", Cell(network.essid)});
        table.push_back({"BSSID", Cell(BssidText(network.bssid))});
        table.push_back({"Channel", ChannelCell(network)});
        table.push_back({"Protocol", Cell(ProtocolText(network))});
        table.push_back({"Security", Cell(SecurityText(network))});
        table.push_back({"Signal", SignalCell(network.signal)});
    }
    table.push_back({"Address", Cell(address)});
    return table;
}

Json::Value ToJson(const WirelessConf& conf, bool showSecrets) {
    Json::Value document = ToJson(conf.network);
    for (const char* key : {"channel", "signal", "protocol"}) {
        document.removeMember(key);  // not saved
    }
    document["key"] = TextOrNull(SecretText(conf.key, showSecrets));
    document["user"] = TextOrNull(conf.user);
    document["dhcp"] = IsDHCP(conf);
    document["ip"] = IsDHCP(conf) ? Json::Value() : TextOrNull(conf.ipAddr);
    document["netmask"] = TextOrNull(conf.netmask);
    document["gateway"] = TextOrNull(conf.gateway);
    document["last_used"] = NumberOrNull(conf.accessTime);
    return document;
}

Json::Value ToJson(const std::vector<WirelessConf>& confs) {
    Json::Value documents(Json::arrayValue);
    for (const WirelessConf& conf : confs) {
        documents.append(ToJson(conf, false));
    }
    return documents;
}

std::string ListText(const std::vector<WirelessConf>& confs) {
    if (confs.empty()) {
        return "No network is saved.\n";
    }
    Table table{{"NETWORK", "SECURITY", "BSSID", "ADDRESS", "LAST USED"}};
    for (const WirelessConf& conf : confs) {
        table.push_back({Cell(conf.network.essid), Cell(SecurityText(conf.network)),
                         Cell(BssidText(conf.network.bssid)), Cell(AddressText(conf)),
                         Cell(TimeText(conf.accessTime))});
    }
    return ToText(table);
}

Table ShowTable(const WirelessConf& conf, bool showSecrets) {
    return {{"Network", Cell(conf.network.essid)},
            {"BSSID", Cell(BssidText(conf.network.bssid))},
            {"Security", Cell(SecurityText(conf.network))},
            {"Key", Cell(SecretText(conf.key, showSecrets))},
            {"User", Cell(conf.user)},
            {"Address", Cell(AddressText(conf))},
            {"Netmask", Cell(conf.netmask)},
            {"Gateway", Cell(conf.gateway)},
            {"Last used", Cell(TimeText(conf.accessTime))}};
}

}  // namespace taviwireless::cli
