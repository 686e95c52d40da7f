// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_PATHS_H
#define TAVIWIRELESS_WIRELESS_RULES_PATHS_H

#include <string>

// The files that the Wi-Fi half shares with other programs or among its functions, and the programs
// of the appliance that it runs.
namespace taviwireless::wireless {

// How lines are written: of key/value files, each in one of the first two forms, and of sections.
constexpr char kPlainLine[] = "%s=%s\n";
constexpr char kQuotedLine[] = "%s=\"%s\"\n";
constexpr char kSectionLine[] = "\t%s=%s\n";

// Stores, with a section per network or adapter.
constexpr char kSavedNetworks[] = "/usr/tavi/etc/wireless.conf";
constexpr char kAPSettings[] = "/usr/tavi/etc/wireless_ap.conf";

// Key/value: "country". Not in the store above, whose sections hold what the library knows.
constexpr char kCountry[] = "/usr/tavi/etc/wireless_country.conf";

constexpr char kAdapterInfo[] = "/tmp/wireless.info";         // key/value; of the plugged adapter
constexpr char kModelInfo[] = "/etc.defaults/taviinfo.conf";  // key/value; what the model can do

constexpr char kHotplugScript[] = "/usr/tavi/hotplug/usb.wireless.function";
constexpr char kNetworkScript[] = "/etc/rc.network";  // restart INTERFACE BRIDGE

// Station
constexpr char kSupplicantConf[] = "/usr/tavi/etc/wpa_supplicant.conf";
constexpr char kSupplicantSockets[] = "/var/run/wpa_supplicant";
constexpr char kSupplicantPidFile[] = "/var/run/wpa_supplicant.pid";
constexpr char kConnectingFlag[] = "/var/tmp/.wireless_connecting";
constexpr char kCurrentConnection[] = "/var/tmp/.wireless_current_connection";
constexpr char kResolver[] = "/etc/resolv.conf";
constexpr char kResolverBackup[] = "/etc/resolv.conf.wireless.bak";
constexpr char kDhcpClientPrefix[] = "/etc/dhcpc/dhcpcd-";  // the interface and ".pid" or ".info"

// Access point
constexpr char kAPFlag[] = "/var/tmp/.wireless_ap_connecting";
constexpr char kHostapdSockets[] = "/var/run/hostapd";
constexpr char kHostapdFolder[] = "/etc/hostapd";

// All of these in folders that others may use too, whether they can write there or not.
constexpr const char* kPathsAmongOthers[] = {
    kAdapterInfo,       kConnectingFlag, kCurrentConnection, kAPFlag,
    kSupplicantPidFile, kHostapdSockets, kSupplicantSockets};

// The settings of an interface or a bridge.
inline std::string InterfaceFile(const std::string& name) {
    return "/etc/sysconfig/network-scripts/ifcfg-" + name;
}

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

// The bridge's DHCP service.
inline std::string DhcpServerInfo(const std::string& bridge) {
    return "/etc/dhcpd/dhcpd-" + bridge + "-" + bridge + ".info";
}

inline std::string DhcpServerLeases(const std::string& bridge) {
    return "/etc/dhcpd/dhcpd-" + bridge + "-" + bridge + ".leases";
}

// Where the bridge's DHCP service is kept while the access point is off.
inline std::string DhcpServerPutAside(const std::string& bridge) {
    return DhcpServerInfo(bridge) + ".manual";
}

}  // namespace taviwireless::wireless

#endif
