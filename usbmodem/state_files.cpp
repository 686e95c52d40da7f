#include "usbmodem/state_files.h"

#include <sys/stat.h>
#include <tavicore/file.h>

namespace taviwireless::usbmodem_lib {

bool MakeEmptyFile(const std::string& path) {
    if (VEXACFileExist(path.c_str()) == 1) {
        VEXACSysUnlink(path.c_str());
    }
    return VEXACFileTouch(path.c_str()) == 0 && chmod(path.c_str(), kStateFileMode) == 0;
}

}  // namespace taviwireless::usbmodem_lib
