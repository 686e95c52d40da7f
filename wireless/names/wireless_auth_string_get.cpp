#include <taviwireless/wireless.h>

const char* TAVIWirelessAuthStringGet(int auth) {
    switch (auth) {
        case WIRELESS_AUTH_OPEN:
            return "OPEN";
        case WIRELESS_AUTH_SHARED:
            return "SHARED";
        case WIRELESS_AUTH_WEP_AUTO:
            return "WEPAUTO";
        case WIRELESS_AUTH_WPA_PSK:
            return "WPAPSK";
        case WIRELESS_AUTH_WPA2_PSK:
            return "WPA2PSK";
        case WIRELESS_AUTH_WPA_NONE:
            return "WPANONE";
        case WIRELESS_AUTH_WPA_EAP:
            return "WPAEAP";
        case WIRELESS_AUTH_WPA2_EAP:
            return "WPA2EAP";
        default:
            return "unknown";
    }
}
