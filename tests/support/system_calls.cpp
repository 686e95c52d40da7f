// SPDX-License-Identifier: MIT
#include "tests/support/system_calls.h"

#include <elf.h>
#include <fcntl.h>
#include <linux/seccomp.h>
#include <poll.h>
#include <seccomp.h>
#include <signal.h>
#include <sys/ioctl.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/uio.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <climits>
#include <exception>
#include <filesystem>
#include <fstream>
#include <future>
#include <map>
#include <set>
#include <sstream>
#include <system_error>
#include <thread>

#include "base/unique_fd.h"

namespace taviwireless::test {
namespace {

// The calls that are counted, by what their first or second argument is. close() is not: a signal
// with a handler ends a call that waits to be let on, and nobody expects that of close().
constexpr char kOfPaths[] =
    "open stat lstat access readlink mkdir mknod rename unlink rmdir link symlink chmod chown "
    "lchown "
    "truncate execve chdir statfs utime utimes";
constexpr char kOfPathsInFolders[] =
    "openat openat2 newfstatat statx faccessat faccessat2 readlinkat mkdirat mknodat renameat "
    "renameat2 unlinkat linkat symlinkat fchmodat fchownat utimensat inotify_add_watch";
constexpr char kOfDescriptors[] =
    "read pread64 readv write pwrite64 writev fstat fstatfs getdents64 fsync fdatasync ftruncate "
    "fchmod fchown flock fcntl ioctl dup fchdir connect bind listen accept4 "
    "sendto sendmsg recvfrom recvmsg setsockopt getsockopt";
constexpr char kOfOthers[] =
    "fork vfork clone clone3 pipe pipe2 socket socketpair memfd_create inotify_init1 kill "
    "wait4 waitid semget semop semtimedop semctl poll ppoll select pselect6";

constexpr unsigned kMark = 0x7461766b;  // an option that prctl() does not know

enum class Subject { kPath, kPathInFolder, kDescriptor, kNone };

const std::map<int, std::pair<std::string, Subject>>& CountedCalls() {
    static const auto kCalls = [] {
        std::map<int, std::pair<std::string, Subject>> calls;
        const std::pair<const char*, Subject> kGroups[] = {
            {kOfPaths, Subject::kPath},
            {kOfPathsInFolders, Subject::kPathInFolder},
            {kOfDescriptors, Subject::kDescriptor},
            {kOfOthers, Subject::kNone}};
        for (const auto& [names, subject] : kGroups) {
            std::istringstream words(names);
            for (std::string name; words >> name;) {
                const int number = seccomp_syscall_resolve_name(name.c_str());
                if (number >= 0) {  // some machines lack some
                    calls[number] = {name, subject};
                }
            }
        }
        return calls;
    }();
    return kCalls;
}

// Calls by which processes come and change their program, which is followed always.
bool MakesProcess(const std::string& call) {
    static const std::set<std::string> kCalls = {"fork", "vfork", "clone", "clone3", "execve"};
    return kCalls.count(call) > 0;
}

// From now on, the counted calls of this thread and of what it starts wait for the owner of the
// descriptor: all, or those that a fault is of. Without a descriptor, errno tells why.
UniqueFd ReportCalls(const std::optional<Fault>& fault) {
    seccomp_reset(nullptr, 0);  // the library keeps the descriptor of the thread before
    const std::unique_ptr<void, decltype(&seccomp_release)> filter(seccomp_init(SCMP_ACT_ALLOW),
                                                                   seccomp_release);
    for (const auto& [number, call] : CountedCalls()) {
        if (!fault || call.first == fault->call || MakesProcess(call.first)) {
            seccomp_rule_add(filter.get(), SCMP_ACT_NOTIFY, number, 0);
        }
    }
    seccomp_rule_add(filter.get(), SCMP_ACT_NOTIFY, SYS_prctl, 1, SCMP_A0(SCMP_CMP_EQ, kMark));
    errno = -seccomp_load(filter.get());
    return UniqueFd(errno == 0 ? seccomp_notify_fd(filter.get()) : -1);
}

std::string ProcessFile(pid_t process, const std::string& name) {
    return "/proc/" + std::to_string(process) + "/" + name;
}

std::string LinkTarget(const std::string& path) {
    std::error_code gone;
    return std::filesystem::read_symlink(path, gone);
}

std::string TextAt(pid_t process, uint64_t address) {
    char text[PATH_MAX + 1] = "";
    // In two parts: the page behind the text may be no memory.
    const size_t first = PATH_MAX - address % PATH_MAX;
    const iovec to{text, PATH_MAX};
    const iovec from[] = {{reinterpret_cast<void*>(address), first},
                          {reinterpret_cast<void*>(address + first), PATH_MAX - first}};
    process_vm_readv(process, &to, 1, from, 2, 0);
    return text;
}

std::string SubjectOf(const seccomp_notif& request, Subject subject) {
    const pid_t process = static_cast<pid_t>(request.pid);
    const auto& arguments = request.data.args;
    std::string path;
    if (subject == Subject::kPath || subject == Subject::kPathInFolder) {
        path = TextAt(process, arguments[subject == Subject::kPath ? 0 : 1]);
    }
    const bool isOfDescriptor = subject == Subject::kPathInFolder && path.empty();  // fstat() is
    if (subject == Subject::kDescriptor || isOfDescriptor) {
        path = LinkTarget(ProcessFile(process, "fd/" + std::to_string(arguments[0])));
    }
    return path;
}

// What "/proc" says of a process; an empty name when it has ended.
struct ProcessStatus {
    std::string name;
    pid_t parent = 0;
};

ProcessStatus StatusOf(pid_t process) {
    std::ifstream file(ProcessFile(process, "stat"));
    std::string text;
    std::getline(file, text, '\0');
    const size_t name = text.find('(') + 1;
    const size_t end = text.rfind(')');
    char state = 'Z';
    ProcessStatus status;
    if (end != std::string::npos) {
        std::istringstream(text.substr(end + 1)) >> state >> status.parent;
    }
    if (state != 'Z') {
        status.name = text.substr(name, end - name);
    }
    return status;
}

// Where the loader of a process begins; 0 if there is none.
uint64_t LoaderOf(pid_t process) {
    std::ifstream entries(ProcessFile(process, "auxv"));
    for (Elf64_auxv_t entry; entries.read(reinterpret_cast<char*>(&entry), sizeof entry);) {
        if (entry.a_type == AT_BASE) {
            return entry.a_un.a_val;
        }
    }
    return 0;
}

class Watch {
  public:
    Watch(const std::optional<Fault>& fault, const std::string& program,
          const std::set<std::string>& mayStay)
        : fault_(fault), mayStay_(mayStay) {
        struct stat test {};
        stat(program.c_str(), &program_);
        stat("/proc/self/exe", &test);
        isOfTest_ = test.st_ino == program_.st_ino && test.st_dev == program_.st_dev;
    }

    // Answers until nobody is left who could ask, or those who are left were killed.
    void Serve(const UniqueFd& listener, const std::atomic<bool>& isDone) {
        constexpr int kStep = 5;  // ms
        int patience = 2000;      // steps
        for (;;) {
            pollfd asked{listener.Get(), POLLIN, 0};
            if (poll(&asked, 1, kStep) > 0 && (asked.revents & POLLIN) == 0) {
                return;
            }
            if ((asked.revents & POLLIN) != 0) {
                AnswerNext(listener);
            } else if (isDone) {
                EndThoseLeft(--patience == 0);
            }
        }
    }

    WatchedRun run;

  private:
    void AnswerNext(const UniqueFd& listener) {
        seccomp_notif request{};
        if (seccomp_notify_receive(listener.Get(), &request) != 0) {
            return;  // its process was killed meanwhile
        }
        seccomp_notif_resp answer{request.id, 0, 0, SECCOMP_USER_NOTIF_FLAG_CONTINUE};
        if (IsCounted(request) && IsStruck(request)) {
            answer.flags = 0;
            answer.error = -fault_->error;
        }
        seccomp_notify_respond(listener.Get(), &answer);
    }

    bool IsCounted(const seccomp_notif& request) {
        const auto process = static_cast<pid_t>(request.pid);
        bool& counts = Counts(process);
        if (request.data.nr == SYS_prctl) {
            worker_ = worker_ == 0 ? process : worker_;  // it makes the first call
            counts = request.data.args[1] != 0;
            return false;
        }
        return counts && IsOfProgram(process, request.data.instruction_pointer);
    }

    // As its parent's do at first.
    bool& Counts(pid_t process) {
        const auto [counts, isNew] = counts_.try_emplace(process, !isOfTest_);
        if (isNew && isOfTest_) {
            const pid_t parent = StatusOf(process).parent;
            const auto known = counts_.find(parent == getpid() ? worker_ : parent);
            counts->second = known != counts_.end() && known->second;
        }
        return counts->second;
    }

    bool IsOfProgram(pid_t process, uint64_t instruction) {
        struct stat program {};
        if (stat(ProcessFile(process, "exe").c_str(), &program) != 0 ||
            program.st_ino != program_.st_ino || program.st_dev != program_.st_dev) {
            loaders_.erase(process);
            return false;
        }
        const auto [loader, isNew] = loaders_.try_emplace(process, 0);
        if (isNew) {
            loader->second = LoaderOf(process);
        }
        constexpr uint64_t kLoaderSize = 0x38000;
        return instruction - loader->second >= kLoaderSize;
    }

    // Notes the call, and whether the fault is to befall it.
    bool IsStruck(const seccomp_notif& request) {
        const auto& [name, subject] = CountedCalls().at(request.data.nr);
        const int number = ++numbers_[name];
        run.calls.push_back({name, number, SubjectOf(request, subject)});
        if (!fault_ || name != fault_->call || number != fault_->number) {
            return false;
        }
        run.struck = run.calls.back();
        if (fault_->error == kKill) {
            kill(static_cast<pid_t>(request.pid), SIGKILL);
        }
        return true;
    }

    // Kills what may stay, once nothing else runs; in the end everything.
    void EndThoseLeft(bool isEnd) {
        std::map<pid_t, std::string> left;
        for (const auto& process : counts_) {
            const std::string name = StatusOf(process.first).name;
            if (!name.empty() && process.first != worker_) {
                left[process.first] = name;
            }
        }
        const auto mayStay = [this](const auto& process) {
            return mayStay_.count(process.second) > 0;
        };
        if (!isEnd && !std::all_of(left.begin(), left.end(), mayStay)) {
            return;
        }
        for (const auto& process : left) {
            kill(process.first, SIGKILL);
            if (!mayStay(process)) {
                run.left.push_back(process.second);
            }
        }
    }

    const std::optional<Fault> fault_;
    const std::set<std::string> mayStay_;
    struct stat program_ {};
    bool isOfTest_;
    pid_t worker_ = 0;
    std::map<std::string, int> numbers_;
    std::map<pid_t, uint64_t> loaders_;
    std::map<pid_t, bool> counts_;  // whether its calls do; all processes that were seen
};

}  // namespace

WatchedRun WatchCalls(const std::function<void()>& work, const std::optional<Fault>& fault,
                      const std::string& program, const std::set<std::string>& mayStay) {
    Watch watch(fault, program, mayStay);
    std::promise<UniqueFd> listener;
    std::atomic<bool> isDone = false;
    std::exception_ptr failure;
    std::thread worker([&] {
        try {
            UniqueFd reported = ReportCalls(fault);
            const bool isWatched = static_cast<bool>(reported);
            listener.set_value(std::move(reported));
            CountMyCalls(false);
            if (!isWatched) {
                throw std::system_error(errno, std::generic_category(),
                                        "Cannot watch system calls");
            }
            work();
        } catch (...) {
            failure = std::current_exception();
        }
        isDone = true;
    });
    const UniqueFd reports = listener.get_future().get();
    if (reports) {
        watch.Serve(reports, isDone);
    }
    worker.join();
    if (failure) {
        std::rethrow_exception(failure);
    }
    return watch.run;
}

void CountMyCalls(bool on) {
    prctl(kMark, on);
}

}  // namespace taviwireless::test
