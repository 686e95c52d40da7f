// SPDX-License-Identifier: MIT
// taviwireless ap stations: who is connected to the access point.
#include <sys/stat.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <fstream>
#include <map>
#include <optional>
#include <sstream>

#include "cli/adapter/requirements.h"
#include "cli/ap/access_point.h"
#include "cli/ap/ap_commands.h"
#include "cli/ap/hostapd.h"
#include "cli/command_error.h"
#include "cli/report.h"
#include "wireless/rules/bridge_names.h"
#include "wireless/rules/paths.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

struct Station {
    std::string ssid;
    std::string mac;
    std::map<std::string, std::string> values;  // as hostapd tells them

    // What a number is when hostapd tells it.
    std::optional<long long> Number(const char* key) const {
        const auto found = values.find(key);
        return found == values.end() ? std::nullopt
                                     : std::make_optional(atoll(found->second.c_str()));
    }
};

// What the bridge knows of a station.
struct Host {
    std::string address;
    std::string name;
};
using Hosts = std::map<std::string, Host>;

bool IsMAC(const std::string& line) {
    return line.size() == 17 && std::count(line.begin(), line.end(), ':') == 5;
}

// A line of each station has its address alone, and those that follow have KEY=VALUE.
std::vector<Station> StationsOf(const std::string& interface, const std::string& ssid) {
    std::vector<Station> stations;
    for (const std::string& line : AskHostapd(interface, "all_sta")) {
        const size_t equals = line.find('=');
        if (IsMAC(line)) {
            stations.push_back({ssid, line, {}});
        } else if (equals != std::string::npos && !stations.empty()) {
            stations.back().values[line.substr(0, equals)] = line.substr(equals + 1);
        }
    }
    // Those that are let in: others have asked, and perhaps with a wrong key.
    stations.erase(std::remove_if(stations.begin(), stations.end(),
                                  [](const Station& station) {
                                      const auto flags = station.values.find("flags");
                                      return flags == station.values.end() ||
                                             flags->second.find("[AUTHORIZED]") ==
                                                 std::string::npos;
                                  }),
                   stations.end());
    return stations;
}

// The DHCP server writes its leases down from time to time; a newer address is with the kernel.
void AddLeases(const std::string& bridge, Hosts& hosts) {
    const wireless::Pipe lines(wireless::Command(
        512, {"dumpleases -d -f ", wireless::Argument{wireless::DhcpServerLeases(bridge)},
              " 2> /dev/null"}));
    char line[256];
    while (lines && fgets(line, sizeof line, lines.get()) != nullptr) {
        std::istringstream words(line);
        std::string mac, address, name, left;
        words >> mac >> address >> name >> left;
        if (IsMAC(mac)) {
            hosts[mac] = {address, left.empty() ? "" : name};  // without a name, the time is third
        }
    }
}

void AddNeighbours(Hosts& hosts) {
    std::ifstream table("/proc/net/arp");
    for (std::string line; std::getline(table, line);) {
        std::istringstream words(line);
        std::string address, type, flags, mac;
        words >> address >> type >> flags >> mac;
        if (IsMAC(mac) && flags != "0x0") {
            hosts[mac].address = address;
        }
    }
}

Json::Value NumberOrNull(const std::optional<long long>& number) {
    return number ? Json::Value(Json::Int64{*number}) : Json::Value();
}

std::string LocalTime(time_t moment) {
    tm local{};
    char text[32];
    return localtime_r(&moment, &local) != nullptr &&
                   strftime(text, sizeof text, "%Y-%m-%d %H:%M", &local) > 0
               ? text
               : "";
}

// Percent of dBm, as in a scan: -50 is all that one can want.
std::optional<long long> SignalOf(const Station& station) {
    const auto level = station.Number("signal");
    return level && *level < 0 ? std::make_optional(std::clamp(2 * (*level + 100), 0LL, 100LL))
                               : std::nullopt;
}

void Add(Report& report, const Station& station, const Host& host) {
    const auto signal = SignalOf(station);
    const auto seconds = station.Number("connected_time");
    const time_t since = time(nullptr) - static_cast<time_t>(seconds.value_or(0));
    Json::Value document;
    document["mac"] = station.mac;
    document["name"] = TextOrNull(host.name);
    document["address"] = TextOrNull(host.address);
    document["signal"] = NumberOrNull(signal);
    document["connected_since"] = seconds ? Json::Value(Json::Int64{since}) : Json::Value();
    document["bytes_received"] = NumberOrNull(station.Number("rx_bytes"));
    document["bytes_sent"] = NumberOrNull(station.Number("tx_bytes"));
    document["ssid"] = station.ssid;
    report.document.append(document);
    report.rows.push_back({station.mac, Cell(host.name), Cell(host.address),
                           signal ? std::to_string(*signal) + "%" : "-",
                           Cell(seconds ? LocalTime(since) : ""), Cell(station.ssid)});
}

Report DescribeAll(const std::vector<Station>& stations, const Hosts& hosts) {
    Report report{{{"STATION", "NAME", "ADDRESS", "SIGNAL", "SINCE", "NETWORK"}}, Json::arrayValue};
    for (const Station& station : stations) {
        const auto host = hosts.find(station.mac);
        Add(report, station, host == hosts.end() ? Host{} : host->second);
    }
    if (stations.empty()) {
        report.rows = {{"Nobody is connected."}};
    }
    return report;
}

}  // namespace

void ListStations(const Options& options) {
    RequireWifiSettings();
    const std::string interface = TAVIWirelessAPInterfaceGet();
    if (!ServesHostapd(interface)) {
        throw CommandError(kFailure, "no access point is on: no hostapd on " + interface +
                                         " answers hostapd_cli; taviwireless ap enable switches "
                                         "it on");
    }
    const WirelessAPConf conf = ReadAPSettings().ap;
    std::vector<Station> stations = StationsOf(interface, conf.ssid);
    Hosts hosts;
    AddLeases(conf.bridge, hosts);
    if (conf.guestEnabled != 0) {
        const auto guests = StationsOf(wireless::kGuestInterface, conf.guestSsid);
        stations.insert(stations.end(), guests.begin(), guests.end());
        AddLeases(wireless::kGuestBridge, hosts);
    }
    AddNeighbours(hosts);
    Print(options, DescribeAll(stations, hosts));
}

}  // namespace taviwireless::cli
