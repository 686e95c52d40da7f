// SPDX-License-Identifier: MIT
#include "usbmodem/info_file.h"

#include <tavicore/keyvalue.h>

#include "base/trusted_file.h"

namespace taviwireless::usbmodem_lib {

bool IsTrustedInfo(const std::string& infoPath) {
    return static_cast<bool>(OpenTrusted(infoPath));
}

std::string ReadInfo(const std::string& infoPath, const char* key) {
    if (!IsTrustedInfo(infoPath)) {
        return "";
    }
    char value[1024];
    const int length = VEXACFileGetKeyValue(infoPath.c_str(), key, value, sizeof value);
    return length > 0 ? value : "";
}

}  // namespace taviwireless::usbmodem_lib
