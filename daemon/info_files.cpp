#include "daemon/info_files.h"

#include <syslog.h>

#include <cerrno>
#include <cstring>

#include "base/trusted_file.h"

namespace taviwireless::daemon {

std::string InfoPath(int interfaceId) {
    return "/tmp/usbmodem.info" + std::to_string(interfaceId);
}

std::optional<std::string> ReadInfoFile(int interfaceId) {
    auto text = ReadTrusted(InfoPath(interfaceId));
    const bool isNone = errno == ENOENT || errno == EPERM || errno == ELOOP || errno == EFBIG;
    if (!text && !isNone) {
        syslog(LOG_ERR, "cannot read %s: %s", InfoPath(interfaceId).c_str(), strerror(errno));
        return "";
    }
    return text;
}

bool NamesPorts(const std::string& info) {
    return info.find("CONNECTNODE=") != std::string::npos &&
           info.find("DEVICENODE=") != std::string::npos;
}

}  // namespace taviwireless::daemon
