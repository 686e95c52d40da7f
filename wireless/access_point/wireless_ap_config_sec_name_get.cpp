// SPDX-License-Identifier: MIT
// Under which name the plugged adapter's settings are stored.
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/rules/paths.h"

int TAVIWirelessApConfigSecNameGet(char* buf, size_t size) {
    using taviwireless::wireless::kAdapterInfo;
    if (buf == nullptr) {
        TAVI_LOG_ERROR("Bad parameter.");
        return 0;
    }
    if (!VEXACFileExist(kAdapterInfo)) {
        TAVI_LOG_ERROR("File[%s] does not exist.", kAdapterInfo);
        return 0;
    }
    return VEXACFileGetKeyValue(kAdapterInfo, "PRODUCT", buf, size) >= 0 ? 1 : 0;
}
