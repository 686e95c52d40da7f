#include <tavicore/keyvalue.h>
#include <taviwireless/wireless.h>

int TAVIWirelessIsSupported_core() {
    return VEXACFileCheckKeyValue("/etc.defaults/taviinfo.conf", "support_wireless", "yes", 0);
}
