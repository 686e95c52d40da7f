#include <tavicore/file.h>
#include <taviwireless/wireless.h>

#include "wireless/ap_files.h"

int TAVIWirelessAPIsConnecting() {
    return VEXACFileExist(taviwireless::wireless::kAPFlag) != 0 ? 1 : 0;
}
