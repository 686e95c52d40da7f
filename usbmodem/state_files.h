#ifndef TAVIWIRELESS_USBMODEM_STATE_FILES_H
#define TAVIWIRELESS_USBMODEM_STATE_FILES_H

#include <sys/types.h>

#include <string>

// Where the state of modems and SIM cards is kept.
namespace taviwireless::usbmodem_lib {

inline constexpr char kStateDirectory[] = "/var/lib/usbmodem";
inline constexpr char kProfilePrefix[] = "/var/lib/usbmodem/usbmodem.profile.";  // and the IMSI
inline constexpr char kDialLogPrefix[] = "/var/lib/usbmodem/wvdial.log.";        // and the IMSI
inline constexpr char kPidFilePrefix[] = "/var/lib/usbmodem/usbmodem.pid.";  // and the interface id
inline constexpr char kStateFilePrefix[] = "/var/lib/usbmodem/usbmodem.conf.";  // interface id

// A profile holds a password, a dialler's log whom the user calls.
inline constexpr mode_t kStateFileMode = 0600;

// Puts an empty file that only its owner may read in the place of whatever file path names.
bool MakeEmptyFile(const std::string& path);

}  // namespace taviwireless::usbmodem_lib

#endif
