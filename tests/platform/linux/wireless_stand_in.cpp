// SPDX-License-Identifier: MIT
// Stands in for libtaviwireless.so.4.
#define STAND_IN extern "C" __attribute__((visibility("default")))

STAND_IN const char* TAVIWirelessInterfaceGet_core() {
    return "wlan7";
}
STAND_IN int TAVIWirelessIsSupported_core() {
    return 7;
}
STAND_IN int TAVIWirelessNetworkDisconnect_core() {
    return 77;
}
