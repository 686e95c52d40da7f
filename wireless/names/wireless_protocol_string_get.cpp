#include <taviwireless/wireless.h>

const char* TAVIWirelessProtocolStringGet(int protocol) {
    switch (protocol) {
        case WIRELESS_PROTOCOL_BG:
            return "11b/g";
        case WIRELESS_PROTOCOL_B:
            return "11b";
        case WIRELESS_PROTOCOL_A:
            return "11a";
        case WIRELESS_PROTOCOL_ABG:
            return "11a/b/g";
        case WIRELESS_PROTOCOL_G:
            return "11g";
        case WIRELESS_PROTOCOL_ABGN:
            return "11a/b/g/n";
        case WIRELESS_PROTOCOL_N:
            return "11n";
        case WIRELESS_PROTOCOL_GN:
            return "11g/n";
        case WIRELESS_PROTOCOL_AN:
            return "11a/n";
        case WIRELESS_PROTOCOL_BGN:
            return "11b/g/n";
        case WIRELESS_PROTOCOL_AGN:
            return "11a/g/n";
        case WIRELESS_PROTOCOL_BN:
            return "11b/n";
        default:
            return "unknown";
    }
}
