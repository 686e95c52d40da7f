#include <taviwireless/wireless.h>

#include "wireless/ap_files.h"
#include "wireless/flag_file.h"

int TAVIWirelessAPIsConnecting() {
    using namespace taviwireless::wireless;
    return FlagFile::IsRaised(kAPFlag) ? 1 : 0;
}
