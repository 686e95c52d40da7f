// SPDX-License-Identifier: MIT
#include "wireless/names/vocabulary.h"

int TAVIWirelessOpmodeParse(const char* text) {
    return taviwireless::wireless::ValueOf(gWirelessOpmodes, text, WIRELESS_OPMODE_UNKNOWN,
                                           __FILE_NAME__, __LINE__);
}
