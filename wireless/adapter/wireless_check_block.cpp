// SPDX-License-Identifier: MIT
// Whether the user lets the radio be used.
#include <tavicore/error.h>
#include <tavicore/keyvalue.h>
#include <tavicore/section.h>
#include <taviwireless/wireless.h>

#include <cstring>

#include "common/sz_hash.h"
#include "wireless/rules/paths.h"
#include "wireless/system/files.h"

int TAVIWirelessCheckBlock() {
    using namespace taviwireless::wireless;
    if (IsMissing(kAPSettings)) {
        return 1;
    }
    char product[1024];
    if (VEXACFileGetKeyValue(kAdapterInfo, "PRODUCT", product, sizeof product) <= 0) {
        VEXACErrSet(VEXAC_ERR_NOT_FOUND);
        return -1;
    }
    taviwireless::SzHash settings(1024);
    if (!settings) {
        return -1;
    }
    const int result = VEXACFileGetSection(kAPSettings, product, settings.Address());
    if (result < 1) {
        return result == 0 ? 1 : -1;
    }
    const char* unblock = settings["unblock"];
    if (unblock == nullptr) {
        return -1;
    }
    return strcmp(unblock, "no") == 0 ? 0 : 1;
}
