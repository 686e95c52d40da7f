#ifndef TAVIWIRELESS_DAEMON_INFO_FILES_H
#define TAVIWIRELESS_DAEMON_INFO_FILES_H

#include <optional>
#include <string>

namespace taviwireless::daemon {

// The info file of a modem, which hot-plug writes.
std::string InfoPath(int interfaceId);

// What the info file says; nothing when the modem is not plugged in: there is no such file, or only
// one of somebody who has no say here. An empty text when it cannot be read now.
std::optional<std::string> ReadInfoFile(int interfaceId);

// Whether the text names the ports. A file that is still being written may not.
bool NamesPorts(const std::string& info);

}  // namespace taviwireless::daemon

#endif
