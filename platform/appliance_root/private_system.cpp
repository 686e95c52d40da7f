// SPDX-License-Identifier: MIT
#include "platform/appliance_root/private_system.h"

#include <fcntl.h>
#include <net/if.h>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <fstream>
#include <string>
#include <utility>
#include <vector>

#include "platform/appliance_root/mounts.h"

namespace taviwireless {
namespace {

namespace fs = std::filesystem;

constexpr unsigned long kKernelFs = MS_NOSUID | MS_NODEV | MS_NOEXEC;
constexpr char kHidden[] =
    "the kernel lets only root do that where a part of the machine's own is covered or missing, as "
    "in a container";

// Mounted in this order. /proc comes first: a bind mount goes through it. The new root lies over
// /sys until it is entered: that one is fresh, so it can be brought back from below.
constexpr Mount kProc = {"proc", "/proc", kKernelFs, nullptr, kHidden};
constexpr Mount kSys = {"sysfs", "/sys", kKernelFs | MS_RDONLY, nullptr, kHidden};
constexpr Mount kNewRoot = {"tmpfs", "/sys", MS_NOSUID | MS_NODEV, "mode=0755", nullptr};

constexpr Mount kEmptyFileSystems[] = {
    {"tmpfs", "/tmp", MS_NOSUID | MS_NODEV, "mode=1777", nullptr},
    {"tmpfs", "/var/tmp", MS_NOSUID | MS_NODEV, "mode=1777", nullptr},
    {"tmpfs", "/run", MS_NOSUID | MS_NODEV, "mode=0755", nullptr},
    {"tmpfs", "/dev", MS_NOSUID, "mode=0755", nullptr},
};

constexpr Mount kDeviceFileSystems[] = {
    {"devpts", "/dev/pts", MS_NOSUID | MS_NOEXEC, "newinstance,ptmxmode=0666,mode=0600", nullptr},
    {"tmpfs", "/dev/shm", MS_NOSUID | MS_NODEV, "mode=1777", nullptr},
};

// Whatever lies directly in one of these has to be brought back to be seen, the innermost first.
constexpr const char* kHiding[] = {"/dev/shm", "/dev", "/run/lock", "/run", "/var/tmp", "/tmp"};

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

// What root sets here is set for the whole machine ...
constexpr const char* kKernelsOwn[] = {"/proc/sys", "/proc/sysrq-trigger", "/proc/irq", "/proc/bus",
                                       "/proc/fs",  "/proc/acpi",          "/proc/scsi"};
// ... but for what belongs to the network and IPC namespaces.
constexpr const char* kNamespacesOwn[] = {"/proc/sys/net",           "/proc/sys/kernel/sem",
                                          "/proc/sys/kernel/shmmax", "/proc/sys/kernel/shmmni",
                                          "/proc/sys/kernel/msgmax", "/proc/sys/kernel/msgmni"};

bool IsBelow(const fs::path& path, const fs::path& folder) {
    const fs::path below = path.lexically_relative(folder);
    return !below.empty() && *below.begin() != ".." && *below.begin() != ".";
}

dev_t DeviceOf(const fs::path& path) {
    struct stat status {};
    return stat(path.c_str(), &status) == 0 ? status.st_dev : 0;
}

// The topmost entry on the way to `path` that will not be seen: an entry of a folder that is about
// to be hidden, or a file system that is mounted below one that is about to be copied. Empty when
// path stays visible.
fs::path HiddenEntry(const fs::path& path) {
    for (const fs::path hiding : kHiding) {
        if (IsBelow(path, hiding)) {
            return hiding / *path.lexically_relative(hiding).begin();
        }
    }
    for (const fs::path copied : kCopied) {
        fs::path entry = IsBelow(path, copied) ? copied : path;
        for (const fs::path& name : path.lexically_relative(entry)) {
            const fs::path folder = std::exchange(entry, entry / name);
            if (name != "." && DeviceOf(entry) != DeviceOf(folder)) {
                return entry;
            }
        }
    }
    return {};
}

std::vector<Kept> KeepDevicesAndWork(const Workplace& workplace) {
    std::vector<Kept> kept;
    for (const char* name : kDevices) {
        kept.emplace_back(std::string("/dev/") + name);
    }
    for (const fs::path& path : {workplace.program, workplace.current}) {
        const fs::path entry = HiddenEntry(path);
        if (!entry.empty()) {
            kept.emplace_back(entry);
        }
    }
    if (!workplace.output.empty()) {
        kept.emplace_back(workplace.output);
    }
    return kept;
}

void CopyFolders(bool inUserNamespace) {
    // The changes are kept in a file system that the empty /tmp will cover.
    MountNew(kEmptyFileSystems[0]);
    for (const fs::path path : kCopied) {
        if (fs::is_directory(path) && !fs::is_symlink(path)) {
            LayCopyOver(path, kEmptyFileSystems[0].target / path.filename(), inUserNamespace);
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

// Shows an entry of the machine's root in the new one, never to be written; `source` is what it is,
// `submounts` as for Bind.
void ShowInNewRoot(const fs::directory_entry& entry, const std::string& source,
                   unsigned long submounts) {
    const fs::path target = kNewRoot.target / entry.path().filename();
    std::error_code unreachable;  // such as a network file system whose server is away
    const fs::file_status status = fs::symlink_status(entry.path(), unreachable);
    if (unreachable) {
        return;
    }
    if (fs::is_symlink(status)) {
        fs::copy_symlink(entry.path(), target);
        return;
    }
    Bind(source, target, submounts);
    if (entry.path() != kProc.target) {
        MakeReadOnly(target);
    }
}

// A root of our own with everything that the machine's has, so that folders can be added to it.
void EnterNewRoot(const fs::path& output) {
    const UniqueFd sys(open(kNewRoot.target, O_PATH | O_CLOEXEC));
    MountNew(kNewRoot);
    for (const char* folder : kAdded) {
        fs::create_directory(fs::path(kNewRoot.target) / folder);
    }
    if (!output.empty()) {
        Bind(output, output, 0);  // a mount of its own, which can have its own protection
    }
    for (const auto& entry : fs::directory_iterator("/")) {
        if (entry.path() == kNewRoot.target) {
            ShowInNewRoot(entry, "/proc/self/fd/" + std::to_string(sys.Get()), 0);
        } else if (!fs::exists(kNewRoot.target / entry.path().filename())) {
            ShowInNewRoot(entry, entry.path(), MS_REC);
        }
    }
    // Moved over the old root like this, because pivot_root refuses a root that is no mount, such
    // as that of a plain chroot, which package builders use.
    if (chdir(kNewRoot.target) != 0 || mount(".", "/", nullptr, MS_MOVE, nullptr) != 0 ||
        chroot(".") != 0 || chdir("/") != 0) {
        FailTo("enter a private root");
    }
    if (!output.empty()) {
        MakeWritable(output);
    }
}

template <size_t count, typename Do>
void ForThoseThere(const char* const (&paths)[count], Do what) {
    for (const char* path : paths) {
        if (fs::exists(path)) {
            what(path);
        }
    }
}

void ProtectKernel() {
    const auto bindToItself = [](const char* path) { Bind(path, path, 0); };
    ForThoseThere(kKernelsOwn, bindToItself);
    ForThoseThere(kNamespacesOwn, bindToItself);
    ForThoseThere(kKernelsOwn, MakeReadOnly);
    ForThoseThere(kNamespacesOwn, MakeWritable);
}

void MakeDirectory(const char* path, mode_t mode) {
    if (mkdir(path, mode) != 0 || chmod(path, mode) != 0) {
        FailTo(std::string("create ") + path);
    }
}

void LayOutDevices() {
    MakeDirectory("/dev/pts", 0755);
    MakeDirectory("/dev/shm", 01777);
    for (const Mount& mounted : kDeviceFileSystems) {
        MountNew(mounted);
    }
    for (const auto& [target, link] : kDeviceLinks) {
        fs::create_symlink(target, link);
    }
}

void BringLoopbackUp() {
    const UniqueFd handle(socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    ifreq request{};
    strcpy(request.ifr_name, "lo");
    request.ifr_flags = IFF_UP;
    if (!handle || ioctl(handle.Get(), SIOCSIFFLAGS, &request) != 0) {
        FailTo("bring lo up");
    }
}

// Later mounts are not seen by the machine then. False when the root is a plain folder, as in a
// chroot.
bool DetachMounts() {
    const bool isDone = mount("none", "/", "none", MS_REC | MS_PRIVATE, nullptr) == 0;
    if (!isDone && errno != EINVAL) {
        FailTo("detach the mounts from the machine's");
    }
    return isDone;
}

// Makes a chroot the real root of our own mounts. A process whose current directory lies outside
// its root can go up to the top.
void LeaveChroot() {
    const UniqueFd folder(open("/", O_PATH | O_CLOEXEC));
    if (chroot("/proc") != 0 || fchdir(folder.Get()) != 0) {
        FailTo("leave the chroot");
    }
    constexpr int kDeepest = 1000;
    for (int i = 0; i < kDeepest && chdir("..") == 0; ++i) {
    }
    if (chroot(".") != 0 || !DetachMounts()) {
        FailTo("leave the chroot");
    }
    constexpr unsigned int kWhole = AT_EMPTY_PATH | AT_RECURSIVE;
    const UniqueFd tree(open_tree(folder.Get(), "", OPEN_TREE_CLONE | OPEN_TREE_CLOEXEC | kWhole));
    if (!tree || move_mount(tree.Get(), "", AT_FDCWD, "/", MOVE_MOUNT_F_EMPTY_PATH) != 0 ||
        fchdir(tree.Get()) != 0 || chroot(".") != 0) {
        FailTo("make the chroot a root");
    }
}

// True also for root of a container that maps its users.
bool IsInUserNamespace() {
    std::ifstream map("/proc/self/uid_map");
    unsigned long first = 0;
    unsigned long outside = 0;
    unsigned long count = 0;
    map >> first >> outside >> count;
    constexpr unsigned long kEveryUser = 4294967295;
    return count != kEveryUser;
}

}  // namespace

void SetUpPrivateSystem(const Workplace& workplace) {
    if (!DetachMounts()) {
        LeaveChroot();
    }
    MountNew(kProc);
    MountNew(kSys);
    EnterNewRoot(workplace.output);
    {
        const std::vector<Kept> kept = KeepDevicesAndWork(workplace);
        CopyFolders(IsInUserNamespace());
        ClearState();
        for (const Mount& mounted : kEmptyFileSystems) {
            MountNew(mounted);
        }
        MakeDirectory("/run/lock", 01777);
        LayOutDevices();
        for (const Kept& entry : kept) {
            entry.BringBack();
        }
    }
    ProtectKernel();
    // Entered anew by its path, since the directory itself may be covered now.
    if (chdir(workplace.current.c_str()) != 0 && chdir("/") != 0) {
        FailTo("enter the current directory " + workplace.current.string());
    }
    BringLoopbackUp();
}

}  // namespace taviwireless
