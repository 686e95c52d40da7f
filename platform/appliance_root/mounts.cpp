// SPDX-License-Identifier: MIT
#include "platform/appliance_root/mounts.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>
#include <utility>
#include <vector>

namespace taviwireless {
namespace {

namespace fs = std::filesystem;

void SetAttributes(const fs::path& path, unsigned int flags, const mount_attr& attributes) {
    mount_attr wanted = attributes;
    if (mount_setattr(AT_FDCWD, path.c_str(), flags, &wanted, sizeof wanted) != 0) {
        FailTo("protect " + path.string(), "that needs Linux 5.12 or newer");
    }
}

// Makes the directory with the permissions of the model, whatever the caller's umask: a service
// inside may run as somebody else.
void CreateLike(const fs::path& model, const fs::path& directory) {
    fs::create_directories(directory);
    fs::permissions(directory, fs::status(model).permissions());
}

// A user namespace does not give power over files of the machine's root, and what a copy of a
// folder lets one do is decided by the owner of its changed half: so that half gets the folders of
// the first two levels beforehand, owned by the caller. Folders that the caller cannot look into
// are added to `closed`.
void OwnFolders(const fs::path& machine, const fs::path& changed, int levels,
                std::vector<fs::path>& closed) {
    for (const auto& entry : fs::directory_iterator(machine)) {
        if (!entry.is_directory() || entry.is_symlink()) {
            continue;
        }
        const fs::path folder = changed / entry.path().filename();
        CreateLike(entry.path(), folder);
        if (access(entry.path().c_str(), R_OK | X_OK) != 0) {
            closed.push_back(entry.path());
        } else if (levels > 1) {
            OwnFolders(entry.path(), folder, levels - 1, closed);
        }
    }
}

}  // namespace

void FailTo(const std::string& what, const char* advice) {
    const int reason = errno;
    std::string sentence = "appliance root: cannot " + what;
    if (advice != nullptr) {
        sentence += std::string(" (") + advice + ")";
    }
    throw std::system_error(reason, std::generic_category(), sentence);
}

void MountNew(const Mount& mounted) {
    if (mount(mounted.type, mounted.target, mounted.type, mounted.flags, mounted.options) != 0) {
        FailTo(std::string("mount a private ") + mounted.target, mounted.advice);
    }
}

void Bind(const std::string& source, const fs::path& target, unsigned long submounts) {
    if (fs::is_directory(source)) {
        fs::create_directories(target);
    } else if (!fs::exists(target)) {
        UniqueFd(open(target.c_str(), O_CREAT | O_CLOEXEC, 0644));
    }
    if (mount(source.c_str(), target.c_str(), "none", MS_BIND | submounts, nullptr) != 0) {
        FailTo("show " + target.string());
    }
}

void MakeReadOnly(const fs::path& path) {
    mount_attr readOnly{};
    readOnly.attr_set = MOUNT_ATTR_RDONLY;
    SetAttributes(path, AT_RECURSIVE, readOnly);
}

void MakeWritable(const fs::path& path) {
    mount_attr writable{};
    writable.attr_clr = MOUNT_ATTR_RDONLY;
    SetAttributes(path, 0, writable);
}

void LayCopyOver(const fs::path& path, const fs::path& store, bool inUserNamespace) {
    const fs::path changed = store / "changed";
    const fs::path work = store / "work";
    CreateLike(path, changed);
    fs::create_directory(work);
    std::string options =
        "lowerdir=" + path.string() + ",upperdir=" + changed.string() + ",workdir=" + work.string();
    std::vector<fs::path> closed;
    if (inUserNamespace) {
        constexpr int kOwnedLevels = 2;
        OwnFolders(path, changed, kOwnedLevels, closed);
        options += ",userxattr";
    }
    if (mount("overlay", path.c_str(), "overlay", 0, options.c_str()) != 0) {
        FailTo("lay a private copy over " + path.string(),
               "the kernel needs overlayfs, allows two layers of it, so none in a container of a "
               "container, and lets only root copy a folder with file systems mounted below it");
    }
    for (const fs::path& folder : closed) {  // as if they were empty
        MountNew({"tmpfs", folder.c_str(), MS_NOSUID | MS_NODEV, "mode=0755", nullptr});
    }
}

Kept::Kept(fs::path path)
    : path_(std::move(path)), handle_(open(path_.c_str(), O_PATH | O_CLOEXEC)) {
    if (!handle_) {
        FailTo("keep " + path_.string() + " visible");
    }
}

void Kept::BringBack() const {
    Bind("/proc/self/fd/" + std::to_string(handle_.Get()), path_, MS_REC);
}

}  // namespace taviwireless
