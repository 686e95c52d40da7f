#ifndef TAVIWIRELESS_DAEMON_INFO_FILES_H
#define TAVIWIRELESS_DAEMON_INFO_FILES_H

#include <optional>
#include <string>
#include <tuple>

namespace taviwireless::daemon {

// The info file of a modem, which hot-plug writes.
std::string InfoPath(int interfaceId);

// Tells two writings of a file apart: inode, seconds and nanoseconds of the last change.
using FileStamp = std::tuple<unsigned long, long, long>;
// Nothing when there is no such file.
std::optional<FileStamp> Stamp(const std::string& path);

}  // namespace taviwireless::daemon

#endif
