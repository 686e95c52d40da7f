// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_WVSTREAMS_LOG_H
#define TAVIWIRELESS_USBMODEM_WVSTREAMS_LOG_H

namespace taviwireless::usbmodem_lib {

// From the first call on, WvStreams' own messages go to the system log; otherwise it prints them on
// the standard error of whoever uses the library.
void SendWvStreamsMessagesToLog();

}  // namespace taviwireless::usbmodem_lib

#endif
