// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_PROFILE_VALUE_H
#define TAVIWIRELESS_USBMODEM_PROFILE_VALUE_H

#include <string>

namespace taviwireless::usbmodem_lib {

// Whether a profile may hold this value: it comes back from the file as it is, and an APN or a
// number does not end its place in the modem's command. When not, the log says why.
bool IsProfileValue(const std::string& key, const std::string& value);

}  // namespace taviwireless::usbmodem_lib

#endif
