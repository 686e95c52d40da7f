#include <tavicore/file.h>
#include <taviwireless/wireless.h>

#include "wireless/ap_files.h"

int TAVIWirelessTestAPMode() {
    return VEXACFileExist(taviwireless::wireless::kAPFlag);
}
