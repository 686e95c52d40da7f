// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_PATHS_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_PATHS_H

#include <string>
#include <vector>

// The network program's own files and those of the programs it runs, where all programs of the
// machine have theirs.
namespace taviwireless::network {

inline constexpr char kLockFile[] = "/var/run/rc.network.lock";
inline constexpr char kJournalFile[] = "/var/run/rc.network.before";

inline std::string OriginsFile(const std::string& bridge) {
    return "/var/run/rc.network-" + bridge + ".origins";
}
inline std::string HostapdPidFile(const std::string& interface) {
    return "/var/run/hostapd-" + interface + ".pid";
}
inline std::string HostapdConf(const std::string& interface) {
    return "/var/run/hostapd-" + interface + ".conf";
}
inline std::string DhcpServerPidFile(const std::string& bridge) {
    return "/var/run/udhcpd-" + bridge + ".pid";
}

inline std::vector<std::string> PathsAmongOthers(const std::string& interface,
                                                 const std::string& bridge) {
    return {kLockFile,
            kJournalFile,
            OriginsFile(bridge),
            HostapdPidFile(interface),
            HostapdConf(interface),
            DhcpServerPidFile(bridge)};
}

}  // namespace taviwireless::network

#endif
