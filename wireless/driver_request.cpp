#include "wireless/driver_request.h"

#include <sys/ioctl.h>
#include <sys/socket.h>
#include <tavisdk/wireless.h>
#include <unistd.h>

#include <cstring>

namespace taviwireless::wireless {

DriverResult RequestDriver(unsigned long request, iwreq& argument) {
    const int handle = socket(AF_INET, SOCK_DGRAM, 0);
    if (handle < 0) {
        return DriverResult::kNoSocket;
    }
    strncpy(argument.ifr_name, TAVIWirelessInterfaceGet(), sizeof argument.ifr_name - 1);
    const bool isDone = ioctl(handle, request, &argument) >= 0;
    // Descriptor 0 is left open: a caller without standard input would get another file in its
    // place, and read that.
    if (handle > 0) {
        close(handle);
    }
    return isDone ? DriverResult::kDone : DriverResult::kRefused;
}

}  // namespace taviwireless::wireless
