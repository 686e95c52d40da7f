// SPDX-License-Identifier: MIT
#include <tavicore/keyvalue.h>
#include <taviwireless/wireless.h>

#include "wireless/rules/paths.h"

int TAVIWirelessAPIsSupported() {
    using taviwireless::wireless::kAdapterInfo;
    return TAVIWirelessAdapterNum() >= 1 &&
                   VEXACFileCheckKeyValue(kAdapterInfo, "AP_SUPPORT", "yes", 0) == 1
               ? 1
               : 0;
}
