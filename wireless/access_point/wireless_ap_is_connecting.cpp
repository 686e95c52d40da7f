// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

#include "wireless/rules/paths.h"
#include "wireless/system/flag_file.h"

int TAVIWirelessAPIsConnecting() {
    using namespace taviwireless::wireless;
    return FlagFile::IsRaised(kAPFlag) ? 1 : 0;
}
