#include <taviwireless/wireless.h>

const char* TAVIWirelessEncryptStringGet(int encrypt, int ccmpNames) {
    switch (encrypt) {
        case WIRELESS_ENCRYPT_NONE:
            return "none";
        case WIRELESS_ENCRYPT_WEP:
            return "WEP";
        case WIRELESS_ENCRYPT_TKIP:
            return "TKIP";
        case WIRELESS_ENCRYPT_AES:
            return ccmpNames != 0 ? "CCMP" : "AES";
        case WIRELESS_ENCRYPT_TKIP_AES:
            return ccmpNames != 0 ? "TKIP CCMP" : "TKIP AES";
        default:
            return "unknown";
    }
}
