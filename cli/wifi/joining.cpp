// SPDX-License-Identifier: MIT
#include "cli/wifi/joining.h"

#include <tavisdk/wireless.h>

#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/report.h"
#include "cli/terminal.h"
#include "cli/wifi/ip_address.h"
#include "cli/wifi/saved_networks.h"
#include "cli/wifi/station.h"
#include "cli/wifi/supplicant_events.h"

namespace taviwireless::cli {

namespace {

std::string SetAddress(const WirelessConf& conf, const std::string& nameServers) {
    const std::string joined = "joined " + Printable(conf.network.essid) + " but ";
    ShowProgress("Setting the address ...");
    const bool isSet = TAVIWirelessIfconfigSet(WifiInterface().c_str(), &conf) == 0;
    // The library may report success although there was no lease.
    if (IsDHCP(conf) && (!isSet || WifiAddress().empty())) {
        return joined + "got no address by DHCP; --static sets one";
    }
    if (!isSet) {
        return joined + "could not set the address " + conf.ipAddr;
    }
    if (IsDHCP(conf) && !UseLeasedGateway()) {
        return joined + "could not make " + ConnectionGateway() + " the gateway";
    }
    if (!IsDHCP(conf) && conf.gateway[0] != '\0' && !SetDefaultGateway(conf.gateway)) {
        return joined + "could not make " + conf.gateway + " the gateway";
    }
    if (!SetNameServers(nameServers)) {
        return joined + "could not set its name servers in /etc/resolv.conf";
    }
    return "";
}

}  // namespace

std::string Join(WirelessConf& conf, const std::string& nameServers) {
    const std::string name = Printable(conf.network.essid);
    ShowProgress("Joining " + name + " ...");
    SupplicantEvents events;
    if (TAVIWirelessNetworkConnect(&conf) != 0) {
        const std::string reason = events.WhyNotJoined();
        const bool isOpen = SecurityOf(conf.network) == Security::kOpen;
        return "could not join " + name +
               (!reason.empty() ? ": " + reason
                : isOpen        ? ": its access point may be too far away"
                                : ": the key may be wrong, or its access point too far away");
    }
    return SetAddress(conf, nameServers);
}

FormerConnection::FormerConnection() {
    const WirelessStatus status = LookAtWifi();
    if (status.status != WIRELESS_STATUS_CONNECTED) {
        return;
    }
    name_ = Printable(status.network.essid);
    const std::vector<WirelessConf> all = SavedNetworks();
    if (const WirelessConf* saved = FindSaved(all, status.network); saved != nullptr) {
        saved_ = *saved;
        saved_->network.opmode = WIRELESS_OPMODE_MANAGED;
        saved_->network.protocol = status.network.protocol;  // is not saved
        saved_->anyBssid = 1;
    }
}

std::string FormerConnection::ComeBack() {
    TAVIWirelessNetworkDisconnect();
    if (name_.empty()) {
        return "";
    }
    if (!saved_) {
        return "; " + name_ +
               ", which was left for it, is not saved, so there is no connection now";
    }
    const std::string fault = Join(*saved_, SavedNameServers(*saved_));
    if (fault.empty()) {
        return "; back on " + name_;
    }
    TAVIWirelessNetworkDisconnect();
    return "; " + name_ + " was left for it, and going back failed too (" + fault +
           "), so there is no connection now";
}

void FormerConnection::Undo(const Options& options, const std::string& why) const {
    ShowProgress("");
    CleanUpAttempt();
    PrintFailure(options, why + ": " + WifiInterface() + " is not connected" +
                              (name_.empty() ? "" : "; " + name_ + " was left already"));
}

}  // namespace taviwireless::cli
