#ifndef TAVIWIRELESS_USBMODEM_INFO_FILE_H
#define TAVIWIRELESS_USBMODEM_INFO_FILE_H

#include <string>

namespace taviwireless::usbmodem_lib {

// Returns the value of key in a modem's info file; empty when there is none.
std::string ReadInfo(const std::string& infoPath, const char* key);

}  // namespace taviwireless::usbmodem_lib

#endif
