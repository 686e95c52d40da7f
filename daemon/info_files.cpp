#include "daemon/info_files.h"

#include <sys/stat.h>

namespace taviwireless::daemon {

std::string InfoPath(int interfaceId) {
    return "/tmp/usbmodem.info" + std::to_string(interfaceId);
}

std::optional<FileStamp> Stamp(const std::string& path) {
    struct stat file {};
    if (stat(path.c_str(), &file) != 0) {
        return std::nullopt;
    }
    return FileStamp(file.st_ino, file.st_mtim.tv_sec, file.st_mtim.tv_nsec);
}

}  // namespace taviwireless::daemon
