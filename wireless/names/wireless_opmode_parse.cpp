#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/names/vocabulary.h"

int TAVIWirelessOpmodeParse(const char* text) {
    if (text == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return WIRELESS_OPMODE_UNKNOWN;
    }
    return taviwireless::wireless::ValueOf(gWirelessOpmodes, text, WIRELESS_OPMODE_UNKNOWN);
}
