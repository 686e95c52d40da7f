#ifndef TAVIWIRELESS_USBMODEM_RULES_PATHS_H
#define TAVIWIRELESS_USBMODEM_RULES_PATHS_H

#include <string>

// Where modems are found, and where the state of modems and SIM cards is kept.
namespace taviwireless::usbmodem_lib {

// An info file, which hot-plug writes, is called so and by the interface id.
inline constexpr char kInfoDirectory[] = "/tmp/";
inline constexpr char kInfoName[] = "usbmodem.info";

inline constexpr char kPortPrefix[] = "/dev/ttyUSB";  // and a number
inline constexpr char kLockDirectory[] = "/var/lock/";
inline constexpr char kLockName[] = "LCK..";  // and the name of a port

inline constexpr char kStateDirectory[] = "/var/lib/usbmodem";
inline constexpr char kProfilePrefix[] = "/var/lib/usbmodem/usbmodem.profile.";  // and the IMSI
inline constexpr char kDialLogPrefix[] = "/var/lib/usbmodem/wvdial.log.";        // and the IMSI
inline constexpr char kPidFilePrefix[] = "/var/lib/usbmodem/usbmodem.pid.";  // and the interface id
inline constexpr char kStateFilePrefix[] = "/var/lib/usbmodem/usbmodem.conf.";  // likewise

inline std::string InfoPath(int interfaceId) {
    return std::string(kInfoDirectory) + kInfoName + std::to_string(interfaceId);
}

}  // namespace taviwireless::usbmodem_lib

#endif
