// SPDX-License-Identifier: MIT
// The files and folders that the library reads and writes.
#include <sys/stat.h>
#include <sys/statvfs.h>
#include <taviwireless/wireless.h>

#include <cerrno>
#include <cstring>

#include "base/join.h"
#include "base/trusted_file.h"
#include "cli/doctor/check.h"
#include "cli/modem/modem_access.h"
#include "usbmodem/rules/paths.h"
#include "wireless/rules/paths.h"

namespace taviwireless::cli {

namespace {

// Whose file it is, and who else may read it or write in it.
Findings LookAtFile(const std::string& path, bool holdsSecrets) {
    struct stat status {};
    if (lstat(path.c_str(), &status) != 0) {
        return errno == ENOENT || errno == ENOTDIR
                   ? Findings()
                   : Unknown(path + ": " + strerror(errno), "look as root");
    }
    if (!IsTrustedOwner(status.st_uid)) {
        return Failed(
            path + " belongs to user " + std::to_string(status.st_uid) + ", and does not count",
            "chown root " + path);
    }
    if ((status.st_mode & 022) != 0 && !S_ISLNK(status.st_mode)) {
        return Failed("others can write in " + path, "chmod go-w " + path);
    }
    if (holdsSecrets && (status.st_mode & 044) != 0) {
        return Warning("others can read the keys in " + path, "chmod go-r " + path);
    }
    return {};
}

Findings Files() {
    const std::string interface = TAVIWirelessAPInterfaceGet();
    Findings wrong;
    for (const std::string& path :
         {std::string(wireless::kSavedNetworks), std::string(wireless::kAPSettings),
          std::string(wireless::kSupplicantConf), wireless::HostapdHostConf(interface),
          wireless::HostapdGuestConf(interface), std::string(usbmodem_lib::kStateDirectory)}) {
        Append(wrong, LookAtFile(path, true));
    }
    for (const std::string& path :
         {std::string(wireless::kAdapterInfo), std::string(wireless::kModelInfo),
          std::string(wireless::kNetworkScript), wireless::InterfaceFile(interface)}) {
        Append(wrong, LookAtFile(path, false));
    }
    return wrong.empty() ? Ok("settings belong to root, and their keys are for nobody else")
                         : wrong;
}

constexpr const char* kFolders[] = {
    "/etc",       "/usr/tavi/etc", "/etc/hostapd", "/etc/sysconfig/network-scripts",
    "/etc/dhcpd", "/etc/dhcpc",    "/etc/ppp",     usbmodem_lib::kStateDirectory,
    "/tmp",       "/var/tmp",      "/var/run",     "/var/lock"};

Findings Folders() {
    if (access("/usr/tavi/etc", F_OK) != 0) {
        return Failed("there is no folder /usr/tavi/etc for settings", "mkdir -p /usr/tavi/etc");
    }
    std::string readOnly;
    for (const char* folder : kFolders) {
        struct statvfs disk {};
        if (statvfs(folder, &disk) == 0 && (disk.f_flag & ST_RDONLY) != 0) {
            AddItem(readOnly, folder);
        }
    }
    return readOnly.empty() ? Ok("all can be written in")
                            : Failed("on a read-only file system: " + readOnly,
                                     "mount it for writing: mount -o remount,rw");
}

Findings Space() {
    constexpr unsigned long kLittle = 1UL << 20;  // bytes; a file is written anew beside the old
    std::string full;
    std::string nearlyFull;
    for (const char* folder : kFolders) {
        struct statvfs disk {};
        if (statvfs(folder, &disk) != 0 || (disk.f_flag & ST_RDONLY) != 0) {
            continue;
        }
        const bool hasNodes = disk.f_files == 0 || disk.f_favail > 0;  // 0 files: there is no limit
        if (disk.f_bavail == 0 || !hasNodes) {
            AddItem(full, folder);
        } else if (disk.f_bavail * disk.f_frsize < kLittle) {
            AddItem(nearlyFull, folder);
        }
    }
    if (!full.empty()) {
        return Failed("none is left for files in " + full, "remove something there");
    }
    return nearlyFull.empty()
               ? Ok("there is some for files")
               : Warning("less than 1 MB is left in " + nearlyFull, "remove something there");
}

}  // namespace

Checks FileChecks() {
    return {{"files", Files}, {"folders", Folders}, {"disk space", Space}};
}

}  // namespace taviwireless::cli
