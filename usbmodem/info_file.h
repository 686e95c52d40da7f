// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_INFO_FILE_H
#define TAVIWIRELESS_USBMODEM_INFO_FILE_H

#include <string>

namespace taviwireless::usbmodem_lib {

// Whether the file counts as an info file: everybody can write in "/tmp/", so only a regular file
// of root or of the own user does, see base/trusted_file.h.
bool IsTrustedInfo(const std::string& infoPath);

// Returns the value of key in a modem's info file; empty when there is none, or when the file does
// not count.
std::string ReadInfo(const std::string& infoPath, const char* key);

}  // namespace taviwireless::usbmodem_lib

#endif
