// Processes known by their pid file, and children that need no reaping.
#include <fcntl.h>
#include <sys/wait.h>
#include <tavicore/process.h>

#include <climits>
#include <cstdlib>
#include <optional>

#include "base/unique_fd.h"
#include "failure.h"
#include "line.h"
#include "text_file.h"

// glibc 2.36 does not declare these as C functions itself.
extern "C" {
#include <sys/pidfd.h>
}

using namespace tavicore;

namespace {

// What "/proc/PID/stat" says of a process.
struct ProcessStatus {
    char state;
    std::string startTime;  // clock ticks since boot
};

// Throws when there is no such process.
ProcessStatus ReadStatus(const std::string& pid) {
    const std::string text = ReadText(("/proc/" + pid + "/stat").c_str());
    // The program's name, in brackets, may hold blanks and brackets itself.
    const size_t state = text.rfind(')') + 2;
    constexpr int kFieldsToStartTime = 19;  // from the state (field 3) to the start time (field 22)
    size_t begin = state;
    for (int i = 0; i < kFieldsToStartTime; ++i) {
        begin = text.find(' ', begin) + 1;
    }
    return {text.at(state), text.substr(begin, text.find(' ', begin) - begin)};
}

// What a pid file says: the process id, 0 when there is none in it, and perhaps its start time.
struct PidFile {
    pid_t pid;
    std::string startTime;
};

PidFile ReadPidFile(const char* file) {
    RequireAll(file);
    const std::string text = ReadText(file);
    std::string_view rest = text;
    const std::string first(Readable(TakeLine(&rest)));
    const long pid = std::strtol(first.c_str(), nullptr, 10);
    std::string startTime(Readable(TakeLine(&rest)));
    if (startTime.find_first_not_of("0123456789") != startTime.npos) {
        startTime.clear();  // a remark of another writer
    }
    return {pid > 0 && pid <= INT_MAX ? static_cast<pid_t>(pid) : 0, startTime};
}

// Throws when the process is not there any more.
void RequireAlive(const PidFile& process) {
    const ProcessStatus status = ReadStatus(std::to_string(process.pid));
    if (status.state == 'Z' || status.state == 'X' ||
        (!process.startTime.empty() && process.startTime != status.startTime)) {
        throw Failure{VEXAC_ERR_NOT_FOUND};
    }
}

// Reads what the process in between wrote; -1 when it wrote nothing.
pid_t ReadPid(int pipe) {
    pid_t pid = -1;
    ssize_t count = -1;
    do {
        count = read(pipe, &pid, sizeof pid);
    } while (count < 0 && errno == EINTR);
    return count == sizeof pid ? pid : -1;
}

}  // namespace

pid_t VEXACProcForkChildNoWait() {
    return Guarded(-1, [] {
        int ends[2];
        if (pipe2(ends, O_CLOEXEC) != 0) {
            throw Failure{VEXAC_ERR_FORK_FAILED};
        }
        UniqueFd readEnd(ends[0]);
        UniqueFd writeEnd(ends[1]);
        // The child's parent ends at once, so that init, not the caller, reaps the child.
        const pid_t between = fork();
        if (between == 0) {
            const pid_t child = fork();
            if (child == 0) {
                return 0;
            }
            const ssize_t count = write(writeEnd.Get(), &child, sizeof child);
            _exit(count == sizeof child ? 0 : 1);
        }
        writeEnd = UniqueFd();
        const pid_t child = between > 0 ? ReadPid(readEnd.Get()) : -1;
        while (between > 0 && waitpid(between, nullptr, 0) < 0 && errno == EINTR) {
        }
        if (child < 0) {
            throw Failure{VEXAC_ERR_FORK_FAILED};
        }
        return child;
    });
}

int VEXACProcPidFileCreate(const char* file) {
    return Guarded(-1, [&] {
        RequireAll(file);
        ReplaceFile(file, std::to_string(getpid()) + '\n' + ReadStatus("self").startTime + '\n');
        return 0;
    });
}

int VEXACProcAliveByPidFile(const char* file) {
    return Guarded(0, [&] {
        const PidFile process = ReadPidFile(file);
        RequireAlive(process);
        return 1;
    });
}

int VEXACProcSignalByPidFile(const char* file, int signal) {
    return Guarded(-1, [&] {
        const PidFile process = ReadPidFile(file);
        // Opened before it is looked at: from here on the descriptor means this very process, even
        // when that ends and its number is used again.
        const UniqueFd descriptor(process.pid > 0 ? pidfd_open(process.pid, 0) : -1);
        if (!descriptor) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        RequireAlive(process);
        if (pidfd_send_signal(descriptor.Get(), signal, nullptr, 0) != 0) {
            throw Failure{errno == ESRCH ? VEXAC_ERR_NOT_FOUND : VEXAC_ERR_IO};
        }
        return 0;
    });
}

pid_t VEXACReadPidFile(const char* file) {
    return Guarded(-1, [&] { return ReadPidFile(file).pid; });
}
