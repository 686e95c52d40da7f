// A file of its own because clang cannot read the header that it includes.
#include "usbmodem/wvstreams_log.h"

#include <wvsyslog.h>

namespace taviwireless::usbmodem_lib {

void SendWvStreamsMessagesToLog() {
    static WvSyslog log("taviwireless", /*include_appname=*/true);
}

}  // namespace taviwireless::usbmodem_lib
