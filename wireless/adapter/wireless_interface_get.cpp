// SPDX-License-Identifier: MIT
#include <taviwireless/wireless.h>

const char* TAVIWirelessInterfaceGet_core() {
    return "wlan0";
}
