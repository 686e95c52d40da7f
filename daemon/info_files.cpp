// SPDX-License-Identifier: MIT
#include "daemon/info_files.h"

#include <syslog.h>

#include <cerrno>
#include <cstring>

#include "base/trusted_file.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

std::optional<std::string> ReadInfoFile(int interfaceId) {
    const std::string path = usbmodem_lib::InfoPath(interfaceId);
    auto text = ReadTrusted(path);
    const bool isNone = errno == ENOENT || errno == EPERM || errno == ELOOP || errno == EFBIG;
    if (!text && !isNone) {
        syslog(LOG_ERR, "cannot read %s: %s", path.c_str(), strerror(errno));
        return "";
    }
    return text;
}

bool NamesPorts(const std::string& info) {
    return info.find("CONNECTNODE=") != std::string::npos &&
           info.find("DEVICENODE=") != std::string::npos;
}

}  // namespace taviwireless::daemon
