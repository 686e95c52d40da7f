// SPDX-License-Identifier: MIT
#include "cli/wifi/station.h"

#include <arpa/inet.h>
#include <tavisdk/network.h>
#include <tavisdk/wireless.h>
#include <unistd.h>

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstring>
#include <fstream>

#include "base/join.h"
#include "base/split.h"
#include "cli/adapter/requirements.h"
#include "cli/wifi/library_list.h"
#include "cli/wifi/raw_scan.h"
#include "cli/wifi/saved_networks.h"
#include "wireless/rules/paths.h"
#include "wireless/system/driver_request.h"
#include "wireless/system/files.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

// The access point that the driver is associated with, as it says. What the library wrote down when
// it joined knows no address of a hidden network, and not which of several of one name it became.
void UpdateBssid(unsigned char (&bssid)[6]) {
    iwreq request{};
    if (wireless::RequestDriver(SIOCGIWAP, request) == wireless::DriverResult::kDone) {
        std::copy_n(request.u.ap_addr.sa_data, sizeof bssid, bssid);
    }
}

bool HasSameBssid(const NetworkInRange& one, const WirelessNetwork& network) {
    return memcmp(one.network.bssid, network.bssid, sizeof network.bssid) == 0;
}

// Adds what only the raw scan knows: networks without a name, and newer kinds of protection.
void AddRaw(std::vector<NetworkInRange>& all, const std::vector<RawNetwork>& rawOnes) {
    for (const RawNetwork& raw : rawOnes) {
        const auto known = std::find_if(all.begin(), all.end(), [&](const auto& one) {
            return HasSameBssid(one, raw.network);
        });
        if (known != all.end()) {
            known->newerSecurity = raw.newerSecurity;
        } else if (raw.network.essid[0] == '\0') {
            all.emplace_back().network = raw.network;
            all.back().newerSecurity = raw.newerSecurity;
        }
    }
}

}  // namespace

CommandError ScanError() {
    return {kFailure,
            "cannot look for networks on " + WifiInterface() + "; the system log tells why"};
}

std::vector<NetworkInRange> Scan() {
    WirelessLink networks{&networks, &networks};
    if (TAVIWirelessNetworkScan(1, &networks) != 0) {
        throw ScanError();
    }
    std::vector<NetworkInRange> all;
    for (const WirelessNetwork& network : TakeList<WirelessNetwork>(networks)) {
        all.emplace_back().network = network;
    }
    AddRaw(all, LastRawScan());
    const std::vector<WirelessConf> saved = SavedNetworks();
    const WirelessStatus now = LookAtWifi();
    for (NetworkInRange& one : all) {
        one.isInUse = now.status == WIRELESS_STATUS_CONNECTED && HasSameBssid(one, now.network);
        one.isSaved = one.network.essid[0] != '\0' && FindSaved(saved, one.network) != nullptr;
    }
    std::stable_sort(all.begin(), all.end(), [](const auto& a, const auto& b) {
        return a.network.signal > b.network.signal;
    });
    return all;
}

std::string NewerSecurityOf(const WirelessNetwork& network) {
    for (const RawNetwork& raw : LastRawScan()) {
        if (memcmp(raw.network.bssid, network.bssid, sizeof network.bssid) == 0) {
            return raw.newerSecurity;
        }
    }
    return "";
}

bool IsInNetwork(int status) {
    return status == WIRELESS_STATUS_CONNECTED || status == WIRELESS_STATUS_ADHOC;
}

WirelessStatus LookAtWifi() {
    WirelessStatus status{};
    TAVIWirelessStatusGet(&status);
    if (status.status == WIRELESS_STATUS_CONNECTED) {
        UpdateBssid(status.network.bssid);
    }
    return status;
}

std::string WifiAddress() {
    TAVINetIFInfo info{};
    return TAVINetIFGetInfo(WifiInterface().c_str(), &info) == 1 ? info.address : "";
}

std::string ConnectionGateway() {
    char gateway[WIRELESS_ADDRESS_SIZE] = "";
    return TAVIWirelessDefaultGatewayConfGet_core(gateway, sizeof gateway) == 0 ? gateway : "";
}

bool UseLeasedGateway() {
    const std::string gateway = ConnectionGateway();
    return gateway.empty() || TAVIWirelessIsSingle_core() != 1 ||
           SetDefaultGateway(gateway.c_str());
}

std::string GatewayInForce() {
    std::ifstream routes("/proc/net/route");
    std::string line;
    while (std::getline(routes, line)) {
        char interface[TAVI_NET_IF_NAME_SIZE];
        unsigned destination = 0;
        in_addr gateway{};
        if (sscanf(line.c_str(), "%15s %x %x", interface, &destination, &gateway.s_addr) == 3 &&
            interface == WifiInterface() && destination == 0 && gateway.s_addr != 0) {
            return inet_ntoa(gateway);
        }
    }
    return "";
}

std::string NameServersInForce() {
    std::ifstream resolver(wireless::kResolver);
    std::string servers;
    for (std::string word, server; resolver >> word; resolver.ignore(SSIZE_MAX, '\n')) {
        if (word == "nameserver" && resolver >> server) {
            AddItem(servers, server, ",");
        }
    }
    return servers;
}

bool SetNameServers(const std::string& nameServers) {
    if (nameServers.empty()) {
        return true;
    }
    // Leaving the network puts the copy back that was made when it was joined. Where there was
    // nothing to copy, an empty one takes these away again.
    const std::ofstream backup(wireless::kResolverBackup, std::ios::app);
    std::ofstream resolver(wireless::kResolver);
    for (const std::string& server : Split(nameServers, ',')) {
        resolver << "nameserver " << server << '\n';
    }
    return static_cast<bool>(resolver.flush());
}

bool SetDefaultGateway(const char* gateway) {
    // The library does not look at what the tool that it runs returned.
    char inForce[TAVI_NET_ADDRESS_SIZE];
    return TAVIWirelessDefaultGatewaySet(gateway) == 0 &&
           TAVINetDefaultGatewayGet(inForce, sizeof inForce) == 0;
}

void EndConnection() {
    if (TAVIWirelessNetworkDisconnect() != 0) {
        throw CommandError(kFailure,
                           "cannot disconnect " + WifiInterface() + "; the system log tells why");
    }
}

void LeaveNetwork() {
    if (IsInNetwork(TAVIWirelessConnStatusGet())) {
        EndConnection();
    }
}

// Most of it is the library's to undo, but it leaves alone what is not associated yet.
void CleanUpAttempt() {
    TAVIWirelessNetworkDisconnect();
    if (TAVIWirelessOpmodeGet() == WIRELESS_OPMODE_ADHOC) {
        TAVIWirelessOpmodeSet(WIRELESS_OPMODE_MANAGED);
    }
    // A supplicant that had to be killed leaves its own.
    const std::string control = wireless::kSupplicantSockets + ("/" + WifiInterface());
    for (const char* file : {wireless::kCurrentConnection, wireless::kSupplicantConf,
                             wireless::kSupplicantPidFile, control.c_str()}) {
        unlink(file);
    }
    if (!wireless::IsMissing(wireless::kResolverBackup)) {
        rename(wireless::kResolverBackup, wireless::kResolver);
    }
    if (!WifiAddress().empty()) {
        constexpr size_t kCommandSize = 128;
        const wireless::Command release(
            kCommandSize, {"/sbin/ifconfig ", wireless::Argument{WifiInterface()}, " 0.0.0.0"});
        release.Run(wireless::Output::kDropped, __FILE_NAME__, __LINE__);
    }
}

}  // namespace taviwireless::cli
