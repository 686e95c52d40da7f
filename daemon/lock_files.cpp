#include "daemon/lock_files.h"

#include <cstdlib>
#include <filesystem>
#include <system_error>

#include "base/trusted_file.h"

namespace taviwireless::daemon {

namespace {

constexpr char kFolder[] = "/var/lock";
constexpr char kPrefix[] = "LCK..ttyUSB";

}  // namespace

void RemovePortLocks(pid_t process) {
    namespace fs = std::filesystem;
    std::error_code ignored;
    for (const auto& entry : fs::directory_iterator(kFolder, ignored)) {
        if (entry.path().filename().string().rfind(kPrefix, 0) != 0) {
            continue;
        }
        const auto owner = ReadTrusted(entry.path());
        if (owner && std::strtol(owner->c_str(), nullptr, 10) == process) {
            fs::remove(entry.path(), ignored);
        }
    }
}

}  // namespace taviwireless::daemon
