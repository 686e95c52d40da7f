#include <taviwireless/wireless.h>

const char* TAVIWirelessAPInterfaceGet() {
    return "wlan0";
}
