#include "cli/wifi/station.h"

#include <tavisdk/network.h>
#include <tavisdk/wireless.h>

#include <algorithm>
#include <cstdlib>
#include <memory>

#include "cli/adapter/requirements.h"
#include "wireless/rules/paths.h"
#include "wireless/system/driver_request.h"
#include "wireless/system/files.h"

namespace taviwireless::cli {

namespace {

// The members of a list that the library made, which are freed.
template <typename Record>
std::vector<Record> Take(WirelessLink& head) {
    std::vector<Record> records;
    for (WirelessLink* link = head.next; link != &head;) {
        const std::unique_ptr<Record, decltype(&free)> record(WIRELESS_RECORD(link, Record), free);
        link = link->next;
        records.push_back(*record);
    }
    return records;
}

// The access point that the driver is associated with, as it says. What the library wrote down when
// it joined knows no address of a hidden network, and not which of several of one name it became.
void UpdateBssid(unsigned char (&bssid)[6]) {
    iwreq request{};
    if (wireless::RequestDriver(SIOCGIWAP, request) == wireless::DriverResult::kDone) {
        std::copy_n(request.u.ap_addr.sa_data, sizeof bssid, bssid);
    }
}

}  // namespace

CommandError ScanError() {
    return {kFailure,
            "cannot look for networks on " + WifiInterface() + "; the system log tells why"};
}

std::vector<WirelessNetwork> Scan() {
    WirelessLink networks{&networks, &networks};
    if (TAVIWirelessNetworkScan(1, &networks) != 0) {
        throw ScanError();
    }
    std::vector<WirelessNetwork> all = Take<WirelessNetwork>(networks);
    std::stable_sort(all.begin(), all.end(),
                     [](const auto& a, const auto& b) { return a.signal > b.signal; });
    return all;
}

std::vector<WirelessConf> SavedNetworks() {
    if (wireless::IsMissing(wireless::kSavedNetworks)) {
        return {};  // none was ever saved
    }
    WirelessLink confs{&confs, &confs};
    if (TAVIWirelessConfEnumByAtime(&confs) != 0) {
        throw CommandError(kFailure, std::string("cannot read the saved networks in ") +
                                         wireless::kSavedNetworks + "; the system log tells why");
    }
    return Take<WirelessConf>(confs);
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

}  // namespace taviwireless::cli
