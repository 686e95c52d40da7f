#include <tavicore/file.h>
#include <taviwireless/wireless.h>

#include "wireless/rules/ap_files.h"

int TAVIWirelessTestAPMode() {
    return VEXACFileExist(taviwireless::wireless::kAPFlag);
}
