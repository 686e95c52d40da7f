#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/names/vocabulary.h"

int TAVIWirelessProtocolParse(const char* text) {
    if (text == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return WIRELESS_PROTOCOL_UNKNOWN;
    }
    return taviwireless::wireless::ValueOf(gWirelessProtocols, text, WIRELESS_PROTOCOL_UNKNOWN);
}
