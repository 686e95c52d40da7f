// SPDX-License-Identifier: MIT
#include "wireless/system/driver_request.h"

#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>

#include "base/fixed_field.h"
#include "wireless/system/interface.h"

namespace taviwireless::wireless {

DriverResult RequestDriver(unsigned long request, iwreq& argument) {
    const std::string interface = WirelessInterface();
    if (interface.empty()) {
        return DriverResult::kRefused;
    }
    const int handle = socket(AF_INET, SOCK_DGRAM, 0);
    if (handle < 0) {
        return DriverResult::kNoSocket;
    }
    CopyField(argument.ifr_name, interface);
    const bool isDone = ioctl(handle, request, &argument) >= 0;
    // Descriptor 0 is left open: a caller without standard input would get another file in its
    // place, and read that.
    if (handle > 0) {
        close(handle);
    }
    return isDone ? DriverResult::kDone : DriverResult::kRefused;
}

}  // namespace taviwireless::wireless
