// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_INFO_FILES_H
#define TAVIWIRELESS_DAEMON_INFO_FILES_H

#include <optional>
#include <string>

namespace taviwireless::daemon {

// What the info file of a modem says; nothing when the modem is not plugged in: there is no such
// file, or one that does not count (base/trusted_file.h). An empty text when it cannot be read now.
std::optional<std::string> ReadInfoFile(int interfaceId);

// Whether the text names the ports. A file that is still being written may not.
bool NamesPorts(const std::string& info);

}  // namespace taviwireless::daemon

#endif
