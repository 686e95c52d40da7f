// SPDX-License-Identifier: MIT
#include "usbmodem/state_files.h"

#include <fcntl.h>
#include <tavicore/file.h>

#include "base/unique_fd.h"

namespace taviwireless::usbmodem_lib {

bool MakeEmptyFile(const std::string& path) {
    VEXACSysUnlink(path.c_str());
    const UniqueFd file(
        open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, kStateFileMode));
    return static_cast<bool>(file);
}

}  // namespace taviwireless::usbmodem_lib
