#include "cli/wifi/wifi_report.h"

#include <algorithm>
#include <ctime>

#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/terminal.h"
#include "cli/wifi/ip_address.h"
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

void AddNetwork(Report& report, const WirelessNetwork& network) {
    report.Add("essid", "Network", network.essid);
    report.Add("bssid", "BSSID", BssidText(network.bssid));
    report.Add("channel", "Channel", NumberOrNull(network.channel), ChannelCell(network));
    report.Add("protocol", "Protocol", ProtocolText(network));
    report.rows.push_back({"Security", Cell(SecurityText(network))});
    report.document["auth"] = TextOrNull(AuthText(network));
    report.document["encrypt"] = TextOrNull(EncryptText(network));
    report.Add("signal", "Signal", NumberOrNull(network.signal), SignalCell(network.signal));
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

Report DescribeAll(const std::vector<WirelessNetwork>& networks) {
    if (networks.empty()) {
        return {{{"No network is in range."}}, Json::arrayValue};
    }
    Report all{{},
               Json::arrayValue,
               {{"NETWORK", kText}, {"SIGNAL"}, {"SECURITY", kText}, {"CHANNEL"}, {"BSSID"}}};
    for (const WirelessNetwork& network : networks) {
        const std::string essid = network.essid;
        Report one;
        AddNetwork(one, network);
        all.document.append(one.document);
        all.rows.push_back({essid.empty() ? "(hidden)" : Printable(essid),
                            SignalCell(network.signal), Cell(SecurityText(network)),
                            ChannelCell(network), BssidText(network.bssid)});
    }
    return all;
}

Report DescribeAll(const std::vector<WirelessConf>& confs) {
    if (confs.empty()) {
        return {{{"No network is saved."}}, Json::arrayValue};
    }
    Report all{{},
               Json::arrayValue,
               {{"NETWORK", kText}, {"SECURITY", kText}, {"BSSID"}, {"ADDRESS"}, {"LAST USED"}}};
    for (const WirelessConf& conf : confs) {
        all.document.append(Describe(conf).document);
        all.rows.push_back({Cell(conf.network.essid), Cell(SecurityText(conf.network)),
                            Cell(BssidText(conf.network.bssid)), Cell(AddressText(conf)),
                            Cell(TimeText(conf.accessTime))});
    }
    return all;
}

Report Describe(const WirelessConf& conf, bool showSecrets) {
    const WirelessNetwork& network = conf.network;
    const bool isDHCP = IsDHCP(conf);
    Report report;
    report.Add("essid", "Network", network.essid);
    report.Add("bssid", "BSSID", BssidText(network.bssid));
    report.rows.push_back({"Security", Cell(SecurityText(network))});
    report.document["auth"] = TextOrNull(AuthText(network));
    report.document["encrypt"] = TextOrNull(EncryptText(network));
    report.Add("key", "Key", SecretText(conf.key, showSecrets));
    report.Add("user", "User", conf.user);
    report.document["dhcp"] = isDHCP;
    report.Add("ip", "Address", TextOrNull(isDHCP ? "" : conf.ipAddr), Cell(AddressText(conf)));
    report.Add("netmask", "Netmask", conf.netmask);
    report.Add("gateway", "Gateway", conf.gateway);
    report.Add("last_used", "Last used", NumberOrNull(conf.accessTime),
               Cell(TimeText(conf.accessTime)));
    return report;
}

Report Describe(const WirelessStatus& status, const std::string& address) {
    const StatusWord& words = WordsOf(status);
    Report report;
    report.Add("interface", "Interface", WifiInterface());
    report.Add("status", "State", words.word, words.text);
    const Table outsideNetworks = report.rows;
    AddNetwork(report, status.network);
    if (!IsInNetwork(status.status)) {
        report.rows = outsideNetworks;
    }
    report.Add("ip", "Address", address);
    return report;
}

void PrintConnection(const Options& options) {
    const WirelessStatus status = LookAtWifi();
    const std::string address = WifiAddress();
    PrintOutcome(options, StatusLine(status, address), [&] { return Describe(status, address); });
}

}  // namespace taviwireless::cli
