#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/names/vocabulary.h"

int TAVIWirelessAuthParse(const char* text) {
    if (text == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return WIRELESS_AUTH_UNKNOWN;
    }
    return taviwireless::wireless::ValueOf(gWirelessAuths, text, WIRELESS_AUTH_UNKNOWN);
}
