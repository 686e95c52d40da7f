// SPDX-License-Identifier: MIT
// The PPP interfaces of USB modems.
#include <tavicore/error.h>
#include <taviwireless/usbmodem_enum_if.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

#include "base/glob.h"
#include "common/log.h"

namespace {

constexpr char kInterfaces[] = "/sys/class/net/ppp*";
constexpr int kFirstModemUnit = 100;

}  // namespace

int TAVIUSBModemEnumIf(VEXACSzList** list) {
    if (list == nullptr) {
        VEXACErrSet(VEXAC_ERR_BAD_PARAMETER);
        return -1;
    }
    const taviwireless::FolderMatches paths(kInterfaces);
    if (paths.Fault() != nullptr) {
        TAVI_LOG_ERROR("%s", paths.Fault());
        return -1;
    }
    int count = 0;
    for (const char* path : paths) {
        const char* number = path + std::strlen(kInterfaces) - 1;
        char* end = nullptr;
        const long long unit = std::strtoll(number, &end, 10);
        if (end == number) {
            TAVI_LOG_DEBUG("Failed to parse usbmodem id [%s], errno=%s", path, strerror(errno));
        } else if (unit >= kFirstModemUnit) {
            VEXACSzListPush(list, ("ppp" + std::to_string(unit)).c_str());
            ++count;
        }
    }
    return count;
}
