#ifndef TAVIWIRELESS_WIRELESS_RULES_PATHS_H
#define TAVIWIRELESS_WIRELESS_RULES_PATHS_H

// Files that more than one function reads or writes.
namespace taviwireless::wireless {

constexpr char kSupplicantConf[] = "/usr/tavi/etc/wpa_supplicant.conf";
constexpr char kSupplicantPidFile[] = "/var/run/wpa_supplicant.pid";
constexpr char kConnectingFlag[] = "/var/tmp/.wireless_connecting";
constexpr char kCurrentConnection[] = "/var/tmp/.wireless_current_connection";
constexpr char kResolver[] = "/etc/resolv.conf";
constexpr char kResolverBackup[] = "/etc/resolv.conf.wireless.bak";
constexpr char kDhcpClientPrefix[] = "/etc/dhcpc/dhcpcd-";    // the interface and ".pid" or ".info"
constexpr char kAdapterInfo[] = "/tmp/wireless.info";         // key/value; of the plugged adapter
constexpr char kModelInfo[] = "/etc.defaults/taviinfo.conf";  // key/value; what the model can do
constexpr char kAPSettings[] = "/usr/tavi/etc/wireless_ap.conf";
constexpr char kSavedNetworks[] = "/usr/tavi/etc/wireless.conf";

}  // namespace taviwireless::wireless

#endif
