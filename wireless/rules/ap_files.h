#ifndef TAVIWIRELESS_WIRELESS_RULES_AP_FILES_H
#define TAVIWIRELESS_WIRELESS_RULES_AP_FILES_H

#include <tavicore/keyvalue.h>

#include <string>

#include "wireless/rules/paths.h"

// What switching the access point on and off reads, writes and runs.
namespace taviwireless::wireless {

constexpr char kAPFlag[] = "/var/tmp/.wireless_ap_connecting";
constexpr char kNetworkScript[] = "/etc/rc.network";  // restart INTERFACE BRIDGE

// Lines of key/value files; each file is written in one of these forms.
constexpr char kPlainLine[] = "%s=%s\n";
constexpr char kQuotedLine[] = "%s=\"%s\"\n";

// The settings of an interface or a bridge.
inline std::string InterfaceFile(const std::string& name) {
    return "/etc/sysconfig/network-scripts/ifcfg-" + name;
}

constexpr char kHostapdFolder[] = "/etc/hostapd";

// Says whether hostapd is to run.
inline std::string HostapdInfo(const std::string& interface) {
    return "/etc/hostapd/hostapd-" + interface + ".info";
}

// What hostapd is started with: the main network and, joined by the network script, the guests'
// block.
inline std::string HostapdHostConf(const std::string& interface) {
    return "/etc/hostapd/hostapd-" + interface + "-host.conf";
}

inline std::string HostapdGuestConf(const std::string& interface) {
    return "/etc/hostapd/hostapd-" + interface + "-guest.conf";
}

// Says whether the guests' block is to be joined.
inline std::string HostapdGuestInfo(const std::string& interface) {
    return "/etc/hostapd/hostapd-" + interface + "-guest.info";
}

// Whether the model has a guest network.
inline bool OffersGuestNetwork() {
    return VEXACFileCheckKeyValue(kModelInfo, "support_pci_wifi", "yes", 0) != 0;
}

// The bridge's DHCP service.
inline std::string DhcpServerInfo(const std::string& bridge) {
    return "/etc/dhcpd/dhcpd-" + bridge + "-" + bridge + ".info";
}

// Where the bridge's DHCP service is kept while the access point is off.
inline std::string DhcpServerPutAside(const std::string& bridge) {
    return DhcpServerInfo(bridge) + ".manual";
}

}  // namespace taviwireless::wireless

#endif
