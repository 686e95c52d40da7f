// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

const char* TAVIWirelessAPInterfaceGet() {
    return "wlan0";
}
