#include "usbmodem/info_file.h"

#include <tavicore/keyvalue.h>

namespace taviwireless::usbmodem_lib {

std::string ReadInfo(const std::string& infoPath, const char* key) {
    char value[1024];
    const int length = VEXACFileGetKeyValue(infoPath.c_str(), key, value, sizeof value);
    return length > 0 ? value : "";
}

}  // namespace taviwireless::usbmodem_lib
