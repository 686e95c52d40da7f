// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_APPLIANCE_ROOT_MOUNTS_H
#define TAVIWIRELESS_PLATFORM_APPLIANCE_ROOT_MOUNTS_H

#include <sys/mount.h>

#include <filesystem>
#include <string>

#include "base/unique_fd.h"

// Mounts as the appliance root needs them. What fails throws std::system_error with one plain
// sentence.
namespace taviwireless {

// Throws what errno says: "appliance root: cannot WHAT", with advice behind it when there is some.
[[noreturn]] void FailTo(const std::string& what, const char* advice = nullptr);

struct Mount {
    const char* type;
    const char* target;
    unsigned long flags;
    const char* options;
    const char* advice;  // for whom the kernel refuses it, or null
};

void MountNew(const Mount& mounted);

// Shows source at target, which is made if it is not there. submounts is 0 or MS_REC.
void Bind(const std::string& source, const std::filesystem::path& target, unsigned long submounts);

// Everything below path, other mounts included.
void MakeReadOnly(const std::filesystem::path& path);
// The mount at path alone.
void MakeWritable(const std::filesystem::path& path);

// Lays a private copy over path: what is changed there goes to `store`, a directory of a private
// file system, and path itself stays as it is. `inUserNamespace`: see appliance_root.h.
void LayCopyOver(const std::filesystem::path& path, const std::filesystem::path& store,
                 bool inUserNamespace);

// A file or directory that can be shown again after something was mounted over its path.
class Kept {
  public:
    explicit Kept(std::filesystem::path path);
    void BringBack() const;

  private:
    std::filesystem::path path_;
    UniqueFd handle_;
};

}  // namespace taviwireless

#endif
