#include <taviwireless/wireless.h>

const char* TAVIWirelessOpmodeStringGet(int opmode) {
    switch (opmode) {
        case WIRELESS_OPMODE_AUTO:
            return "Auto";
        case WIRELESS_OPMODE_ADHOC:
            return "Ad-Hoc";
        case WIRELESS_OPMODE_MANAGED:
            return "Managed";
        case WIRELESS_OPMODE_MASTER:
            return "Master";
        case WIRELESS_OPMODE_REPEATER:
            return "Repeater";
        case WIRELESS_OPMODE_SECONDARY:
            return "Secondeary";  // so spelt wherever it was printed; it does not parse back
        case WIRELESS_OPMODE_MONITOR:
            return "Monitor";
        default:
            return "Unknown";
    }
}
