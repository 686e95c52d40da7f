// SPDX-License-Identifier: MIT
#include "wireless/names/vocabulary.h"

int TAVIWirelessAuthParse(const char* text) {
    return taviwireless::wireless::ValueOf(gWirelessAuths, text, WIRELESS_AUTH_UNKNOWN,
                                           __FILE_NAME__, __LINE__);
}
