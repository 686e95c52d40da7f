// SPDX-License-Identifier: MIT
#include <tavicore/keyvalue.h>
#include <taviwireless/wireless.h>

#include "wireless/rules/paths.h"

int TAVIWirelessIsSupported_core() {
    return VEXACFileCheckKeyValue(taviwireless::wireless::kModelInfo, "support_wireless", "yes", 0);
}
