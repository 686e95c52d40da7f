// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_RULES_PATHS_H
#define TAVIWIRELESS_USBMODEM_RULES_PATHS_H

#include <climits>
#include <cstdlib>
#include <optional>
#include <string>
#include <vector>

// Where modems are found, and where the state of modems and SIM cards is kept.
namespace taviwireless::usbmodem_lib {

// An info file, which hot-plug writes, is called so and by the interface id.
inline constexpr char kInfoDirectory[] = "/tmp/";
inline constexpr char kInfoName[] = "usbmodem.info";

inline constexpr char kPortPrefix[] = "/dev/ttyUSB";  // and a number
inline constexpr char kLockDirectory[] = "/var/lock/";
inline constexpr char kLockName[] = "LCK..";  // and the name of a port

// The gateway that another part of the system has saved.
inline constexpr char kOtherGatewayBackup[] = "/tmp/pppoe_gw_backup";

inline constexpr char kStateDirectory[] = "/var/lib/usbmodem";
inline constexpr char kDialLogPrefix[] = "/var/lib/usbmodem/wvdial.log.";    // and the IMSI
inline constexpr char kPidFilePrefix[] = "/var/lib/usbmodem/usbmodem.pid.";  // and the interface id
inline constexpr char kStateFilePrefix[] = "/var/lib/usbmodem/usbmodem.conf.";  // likewise

inline std::string InfoPath(int interfaceId) {
    return std::string(kInfoDirectory) + kInfoName + std::to_string(interfaceId);
}
inline std::string LockPath(const std::string& port) {
    return std::string(kLockDirectory) + kLockName + port;
}
// All that a modem has in folders that others may use too, whether they can write there or not.
inline std::vector<std::string> PathsAmongOthers(int interfaceId, const std::string& port) {
    return {InfoPath(interfaceId), LockPath(port), kOtherGatewayBackup};
}
inline std::string ProfilePath(const std::string& imsi) {
    return "/var/lib/usbmodem/usbmodem.profile." + imsi;
}
inline std::string DialLogPath(const std::string& imsi) {
    return kDialLogPrefix + imsi;
}

// Returns the interface id behind the prefix of a file's name; nothing for the names of other
// files, such as backup copies and numbers with leading zeros. -1 is no interface id: compatible
// with earlier releases, in which it means that a name has no number.
inline std::optional<int> InterfaceIdIn(const std::string& name, const std::string& prefix) {
    if (name.rfind(prefix, 0) != 0) {
        return std::nullopt;
    }
    const long number = std::strtol(name.c_str() + prefix.size(), nullptr, 10);
    if (number < INT_MIN || number > INT_MAX || number == -1 ||
        name != prefix + std::to_string(number)) {
        return std::nullopt;
    }
    return static_cast<int>(number);
}

}  // namespace taviwireless::usbmodem_lib

#endif
