#include <taviwireless/wireless.h>

#include "common/log.h"
#include "wireless/names/vocabulary.h"

int TAVIWirelessEncryptParse(const char* text) {
    if (text == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return WIRELESS_ENCRYPT_UNKNOWN;
    }
    return taviwireless::wireless::ValueOf(gWirelessEncrypts, text, WIRELESS_ENCRYPT_UNKNOWN);
}
