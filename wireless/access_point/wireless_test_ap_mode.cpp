// SPDX-License-Identifier: MIT
#include <tavicore/file.h>
#include <taviwireless/wireless.h>

#include "wireless/rules/paths.h"

int TAVIWirelessTestAPMode() {
    return VEXACFileExist(taviwireless::wireless::kAPFlag);
}
