// SPDX-License-Identifier: MIT
// Processes known by their pid file, and children that need no reaping.
#include <sys/wait.h>
#include <tavicore/process.h>

#include "base/process_handle.h"
#include "child_report.h"
#include "failure.h"
#include "pid_file.h"

using namespace tavicore;
using taviwireless::ProcessHandle;

pid_t VEXACProcForkChildNoWait() {
    return Guarded(-1, [] {
        ChildReport report;
        // The child's parent ends at once, so that init, not the caller, reaps the child.
        const pid_t between = fork();
        if (between == 0) {
            const pid_t child = fork();
            if (child == 0) {
                return 0;
            }
            _exit(ChildReport::Tell(report.WriteEnd(), child) ? 0 : 1);
        }
        const pid_t child = between > 0 ? report.Hear().value_or(-1) : -1;
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
        WritePidFile(file, getpid());
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
        const ProcessHandle handle(process.pid);  // before it is looked at
        if (!handle) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        RequireAlive(process);
        if (handle.Signal(signal) != 0) {
            throw Failure{errno == ESRCH ? VEXAC_ERR_NOT_FOUND : VEXAC_ERR_IO};
        }
        return 0;
    });
}

pid_t VEXACReadPidFile(const char* file) {
    return Guarded(-1, [&] {
        const PidFile process = ReadPidFile(file);
        try {
            if (!process.startTime.empty()) {
                RequireAlive(process);
            }
        } catch (const Failure& failure) {
            if (failure.code != VEXAC_ERR_NOT_FOUND) {
                throw;
            }
            return 0;
        }
        return process.pid;
    });
}
