// SPDX-License-Identifier: MIT
#include "wireless/names/vocabulary.h"

int TAVIWirelessProtocolParse(const char* text) {
    return taviwireless::wireless::ValueOf(gWirelessProtocols, text, WIRELESS_PROTOCOL_UNKNOWN,
                                           __FILE_NAME__, __LINE__);
}
