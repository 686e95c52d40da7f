// SPDX-License-Identifier: MIT
#include "daemon/lock_files.h"

#include <cstdlib>
#include <filesystem>
#include <system_error>

#include "base/trusted_file.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

void RemovePortLocks(pid_t process) {
    namespace fs = std::filesystem;
    const std::string prefix = std::string(usbmodem_lib::kLockName) + "ttyUSB";
    std::error_code ignored;
    for (const auto& entry : fs::directory_iterator(usbmodem_lib::kLockDirectory, ignored)) {
        if (entry.path().filename().string().rfind(prefix, 0) != 0) {
            continue;
        }
        const auto owner = ReadTrusted(entry.path());
        if (owner && std::strtol(owner->c_str(), nullptr, 10) == process) {
            fs::remove(entry.path(), ignored);
        }
    }
}

}  // namespace taviwireless::daemon
