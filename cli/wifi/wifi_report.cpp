// SPDX-License-Identifier: MIT
#include "cli/wifi/wifi_report.h"

#include <algorithm>
#include <ctime>

#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/terminal.h"
#include "cli/wifi/ip_address.h"
#include "cli/wifi/network_name.h"
#include "cli/wifi/saved_networks.h"

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

std::string SecurityText(const WirelessNetwork& network, const std::string& newer = "") {
    if (!newer.empty()) {
        return newer;
    }
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

void AddSecurity(Report& report, const WirelessNetwork& network) {
    report.Add("security", "Security", SecurityText(network));
    report.document["auth"] = TextOrNull(AuthText(network));
    report.document["encrypt"] = TextOrNull(EncryptText(network));
}

void AddNetwork(Report& report, const WirelessNetwork& network) {
    report.Add("ssid", "Network", network.essid);
    report.Add("bssid", "BSSID", BssidText(network.bssid));
    report.Add("channel", "Channel", NumberOrNull(network.channel), ChannelCell(network));
    report.Add("protocol", "Protocol", ProtocolText(network));
    AddSecurity(report, network);
    report.Add("signal", "Signal", NumberOrNull(network.signal), SignalCell(network.signal));
}

}  // namespace

std::string ConnectionLine(const WirelessStatus& status, const std::string& address) {
    std::string line = WifiInterface() + ": " + WordsOf(status).text;
    const std::string essid = status.network.essid;
    if (IsInNetwork(status.status) && !essid.empty()) {
        line += (status.status == WIRELESS_STATUS_CONNECTED ? " to " : ", ") + essid;
        line += address.empty() ? "" : ", " + address;
    }
    return Printable(line);
}

Report DescribeAll(const std::vector<NetworkInRange>& networks) {
    if (networks.empty()) {
        return {{{"No network is in range."}}, Json::arrayValue};
    }
    Report all{{},
               Json::arrayValue,
               {{" "},
                {"NETWORK", kText},
                {"SIGNAL"},
                {"SECURITY", kText},
                {"CHANNEL"},
                {"BSSID"},
                {"SAVED"}}};
    for (const NetworkInRange& one : networks) {
        const WirelessNetwork& network = one.network;
        const std::string essid = network.essid;
        Report report;
        AddNetwork(report, network);
        const std::string security = SecurityText(network, one.newerSecurity);
        report.document["security"] = security.empty() ? "other" : security;
        report.document["in_use"] = one.isInUse;
        report.document["saved"] = one.isSaved;
        all.document.append(report.document);
        all.rows.push_back({one.isInUse ? "*" : "", essid.empty() ? "(hidden)" : Printable(essid),
                            SignalCell(network.signal), security.empty() ? "other" : security,
                            ChannelCell(network), BssidText(network.bssid),
                            one.isSaved ? "yes" : "-"});
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
    report.Add("ssid", "Network", network.essid);
    report.Add("bssid", "BSSID", BssidText(network.bssid));
    AddSecurity(report, network);
    report.Add("key", "Key", SecretText(conf.key, showSecrets));
    report.Add("user", "User", conf.user);
    report.document["dhcp"] = isDHCP;
    report.Add("address", "Address", TextOrNull(isDHCP ? "" : conf.ipAddr),
               Cell(AddressText(conf)));
    report.Add("netmask", "Netmask", conf.netmask);
    report.Add("gateway", "Gateway", conf.gateway);
    report.Add("dns", "DNS", SavedNameServers(conf));
    report.Add("last_used", "Last used", NumberOrNull(conf.accessTime),
               Cell(TimeText(conf.accessTime)));
    return report;
}

namespace {

Report Describe(const WirelessStatus& status, const std::string& address) {
    const StatusWord& words = WordsOf(status);
    const bool isInNetwork = IsInNetwork(status.status);
    Report report;
    report.Add("interface", "Interface", WifiInterface());
    report.Add("state", "State", words.word, words.text);
    Table rows = report.rows;
    AddNetwork(report, status.network);
    report.Add("address", "Address", address);
    report.Add("gateway", "Gateway", isInNetwork ? GatewayInForce() : "");
    report.Add("dns", "DNS", isInNetwork ? NameServersInForce() : "");
    if (!isInNetwork) {
        rows.push_back({"Address", Cell(address)});
        report.rows = rows;
    }
    return report;
}

}  // namespace

Report DescribeConnection() {
    return Describe(LookAtWifi(), WifiAddress());
}

void PrintConnection(const Options& options) {
    const WirelessStatus status = LookAtWifi();
    const std::string address = WifiAddress();
    PrintOutcome(options, ConnectionLine(status, address),
                 [&] { return Describe(status, address); });
}

}  // namespace taviwireless::cli
