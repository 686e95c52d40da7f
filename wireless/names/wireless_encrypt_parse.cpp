// SPDX-License-Identifier: MIT
#include "wireless/names/vocabulary.h"

int TAVIWirelessEncryptParse(const char* text) {
    return taviwireless::wireless::ValueOf(gWirelessEncrypts, text, WIRELESS_ENCRYPT_UNKNOWN,
                                           __FILE_NAME__, __LINE__);
}
