#include "platform/root/private_system.h"

#include <fcntl.h>
#include <net/if.h>
#include <sys/ioctl.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

namespace taviwireless {
namespace {

namespace fs = std::filesystem;

struct Mount {
    const char* type;
    const char* target;
    unsigned long flags;
    const char* options;
};

constexpr unsigned long kKernelFs = MS_NOSUID | MS_NODEV | MS_NOEXEC;

// Mounted in this order. /proc comes first: a bind mount goes through it. The new root lies over
// /sys until it is entered: that one is fresh, so it can be brought back from below.
constexpr Mount kProc = {"proc", "/proc", kKernelFs, nullptr};
constexpr Mount kSys = {"sysfs", "/sys", kKernelFs, nullptr};
constexpr Mount kNewRoot = {"tmpfs", "/sys", MS_NOSUID | MS_NODEV, "mode=0755"};

constexpr Mount kEmptyFileSystems[] = {
    {"tmpfs", "/tmp", MS_NOSUID | MS_NODEV, "mode=1777"},
    {"tmpfs", "/var/tmp", MS_NOSUID | MS_NODEV, "mode=1777"},
    {"tmpfs", "/run", MS_NOSUID | MS_NODEV, "mode=0755"},
    {"tmpfs", "/dev", MS_NOSUID, "mode=0755"},
};

constexpr Mount kDeviceFileSystems[] = {
    {"devpts", "/dev/pts", MS_NOSUID | MS_NOEXEC, "newinstance,ptmxmode=0666,mode=0600"},
    {"tmpfs", "/dev/shm", MS_NOSUID | MS_NODEV, "mode=1777"},
};

// What may be changed inside although it is the machine's.
constexpr const char* kCopied[] = {"/etc", "/usr", "/var", "/bin", "/sbin", "/lib"};

// A test starts from a system that was never configured. Links among them lead to /run.
constexpr const char* kEmptied[] = {"/etc/hostapd", "/usr/tavi", "/var/run", "/var/lock"};
constexpr const char* kAbsent[] = {"/var/lib/usbmodem"};

// Folders of the appliance that other machines do not have, nor get: the root that holds them is
// new.
constexpr const char* kAdded[] = {"etc.defaults"};

constexpr const char* kDevices[] = {"null", "zero", "full", "random", "urandom", "tty"};

constexpr std::pair<const char*, const char*> kDeviceLinks[] = {
    {"pts/ptmx", "/dev/ptmx"},          {"/proc/self/fd", "/dev/fd"},
    {"/proc/self/fd/0", "/dev/stdin"},  {"/proc/self/fd/1", "/dev/stdout"},
    {"/proc/self/fd/2", "/dev/stderr"},
};

[[noreturn]] void Fail(const std::string& what) {
    throw std::system_error(errno, std::generic_category(), "appliance root: cannot " + what);
}

void MountOne(const Mount& mounted) {
    if (mount(mounted.type, mounted.target, mounted.type, mounted.flags, mounted.options) != 0) {
        Fail(std::string("mount a private ") + mounted.target);
    }
}

// A file or directory that stays reachable when something is mounted over its path.
class Kept {
  public:
    explicit Kept(std::string path)
        : path_(std::move(path)), handle_(open(path_.c_str(), O_PATH | O_CLOEXEC)) {
        if (handle_ < 0) {
            Fail("keep " + path_ + " visible");
        }
    }
    Kept(Kept&& other) noexcept
        : path_(std::move(other.path_)), handle_(std::exchange(other.handle_, -1)) {}
    ~Kept() {
        if (handle_ >= 0) {
            close(handle_);
        }
    }

    // Makes it visible at its old path again.
    void BringBack() const {
        const std::string link = "/proc/self/fd/" + std::to_string(handle_);
        MakeMountPoint(fs::is_directory(link));
        if (mount(link.c_str(), path_.c_str(), "none", MS_BIND | MS_REC, nullptr) != 0) {
            Fail("keep " + path_ + " visible");
        }
    }

  private:
    void MakeMountPoint(bool directory) const {
        if (directory) {
            fs::create_directory(path_);
        } else {
            close(open(path_.c_str(), O_CREAT | O_CLOEXEC, 0644));
        }
    }

    std::string path_;
    int handle_;
};

// The topmost entry below a directory that is about to be hidden on the way to `path`; empty when
// none of them hides it.
fs::path HiddenEntry(const fs::path& path) {
    for (const Mount& mounted : kEmptyFileSystems) {
        const fs::path below = path.lexically_relative(mounted.target);
        if (!below.empty() && *below.begin() != ".." && *below.begin() != ".") {
            return mounted.target / *below.begin();
        }
    }
    return {};
}

std::vector<Kept> KeepDevicesAndWork(const fs::path& program, const fs::path& workingDirectory) {
    std::vector<Kept> kept;
    for (const char* name : kDevices) {
        kept.emplace_back(std::string("/dev/") + name);
    }
    const fs::path executable = HiddenEntry(program);
    const fs::path current = HiddenEntry(workingDirectory);
    if (!executable.empty()) {
        kept.emplace_back(executable);
    }
    if (!current.empty() && current != executable) {
        kept.emplace_back(current);
    }
    return kept;
}

// Whatever the caller's umask: a service within may run as somebody else.
void CreateLike(const fs::path& model, const fs::path& directory) {
    fs::create_directories(directory);
    fs::permissions(directory, fs::status(model).permissions());
}

// A user namespace does not give power over files of the machine's root, and what a copy of a
// folder lets one do is decided by the owner of its changed half: so that half gets the folders of
// the first two levels beforehand, owned by the caller.
void OwnFolders(const fs::path& machine, const fs::path& changed, int levels) {
    for (const auto& entry :
         fs::directory_iterator(machine, fs::directory_options::skip_permission_denied)) {
        if (entry.is_directory() && !entry.is_symlink()) {
            const fs::path folder = changed / entry.path().filename();
            CreateLike(entry.path(), folder);
            if (levels > 1) {
                OwnFolders(entry.path(), folder, levels - 1);
            }
        }
    }
}

// Mounts an overlay over `path`; its changes go to `store`, a directory of a private file system.
void CopyFolder(const fs::path& path, const fs::path& store, bool inUserNamespace) {
    const fs::path changed = store / "changed";
    const fs::path work = store / "work";
    CreateLike(path, changed);
    fs::create_directory(work);
    if (inUserNamespace) {
        constexpr int kOwnedLevels = 2;
        OwnFolders(path, changed, kOwnedLevels);
    }
    std::string options =
        "lowerdir=" + path.string() + ",upperdir=" + changed.string() + ",workdir=" + work.string();
    if (inUserNamespace) {
        options += ",userxattr";
    }
    if (mount("overlay", path.c_str(), "overlay", 0, options.c_str()) != 0) {
        Fail("lay a private copy over " + path.string());
    }
}

void CopyFolders(bool inUserNamespace) {
    // The changes are kept in a file system that the empty /tmp will cover.
    MountOne(kEmptyFileSystems[0]);
    for (const fs::path path : kCopied) {
        if (fs::is_directory(path) && !fs::is_symlink(path)) {
            CopyFolder(path, kEmptyFileSystems[0].target / path.filename(), inUserNamespace);
        }
    }
}

void EmptyDirectory(const fs::path& path) {
    if (fs::is_symlink(path)) {
        return;
    }
    fs::create_directories(path);
    for (const auto& entry : fs::directory_iterator(path)) {
        fs::remove_all(entry);
    }
}

void ClearState() {
    for (const char* path : kEmptied) {
        EmptyDirectory(path);
    }
    for (const char* path : kAbsent) {
        fs::remove_all(path);
    }
}

// Shows `entry`, something in the machine's root, in the new one; `source` is what it is.
void BindIntoNewRoot(const fs::directory_entry& entry, const std::string& source,
                     unsigned long submounts) {
    const fs::path target = kNewRoot.target / entry.path().filename();
    if (entry.is_symlink()) {
        fs::copy_symlink(entry.path(), target);
        return;
    }
    if (entry.is_directory()) {
        fs::create_directory(target);
    } else {
        close(open(target.c_str(), O_CREAT | O_CLOEXEC, 0644));
    }
    if (mount(source.c_str(), target.c_str(), "none", MS_BIND | submounts, nullptr) != 0) {
        Fail("bind " + entry.path().string());
    }
}

// A root of our own with everything that the machine's has, so that folders can be added to it.
void EnterNewRoot() {
    const int covered = open(kNewRoot.target, O_PATH | O_CLOEXEC);
    MountOne(kNewRoot);
    for (const char* folder : kAdded) {
        fs::create_directory(fs::path(kNewRoot.target) / folder);
    }
    for (const auto& entry : fs::directory_iterator("/")) {
        if (entry.path() == kNewRoot.target) {
            BindIntoNewRoot(entry, "/proc/self/fd/" + std::to_string(covered), 0);
        } else if (!fs::exists(kNewRoot.target / entry.path().filename())) {
            BindIntoNewRoot(entry, entry.path(), MS_REC);
        }
    }
    close(covered);
    // The old root ends up over the new one, from where it is taken away.
    if (chdir(kNewRoot.target) != 0 || syscall(SYS_pivot_root, ".", ".") != 0 ||
        umount2(".", MNT_DETACH) != 0 || chdir("/") != 0) {
        Fail("enter a private root");
    }
}

void MakeDirectory(const char* path, mode_t mode) {
    if (mkdir(path, mode) != 0 || chmod(path, mode) != 0) {
        Fail(std::string("create ") + path);
    }
}

void LayOutDevices() {
    MakeDirectory("/dev/pts", 0755);
    MakeDirectory("/dev/shm", 01777);
    for (const Mount& mounted : kDeviceFileSystems) {
        MountOne(mounted);
    }
    for (const auto& [target, link] : kDeviceLinks) {
        fs::create_symlink(target, link);
    }
}

void BringLoopbackUp() {
    const int handle = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    ifreq request{};
    strcpy(request.ifr_name, "lo");
    request.ifr_flags = IFF_UP;
    const bool up = handle >= 0 && ioctl(handle, SIOCSIFFLAGS, &request) == 0;
    const int error = errno;
    close(handle);
    if (!up) {
        errno = error;
        Fail("bring lo up");
    }
}

}  // namespace

void SetUpPrivateSystem(bool inUserNamespace) {
    if (mount("none", "/", "none", MS_REC | MS_PRIVATE, nullptr) != 0) {
        Fail("detach the mounts from the machine's");
    }
    MountOne(kProc);
    MountOne(kSys);
    const fs::path current = fs::current_path();
    const fs::path program = fs::read_symlink("/proc/self/exe");
    EnterNewRoot();
    {
        const std::vector<Kept> kept = KeepDevicesAndWork(program, current);
        CopyFolders(inUserNamespace);
        ClearState();
        for (const Mount& mounted : kEmptyFileSystems) {
            MountOne(mounted);
        }
        MakeDirectory("/run/lock", 01777);
        LayOutDevices();
        for (const Kept& entry : kept) {
            entry.BringBack();
        }
    }
    // By its path: the directory itself may be one that is covered now.
    if (chdir(current.c_str()) != 0 && chdir("/") != 0) {
        Fail("enter the current directory " + current.string());
    }
    BringLoopbackUp();
}

}  // namespace taviwireless
