// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_PID_FILE_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_PID_FILE_H

#include <sys/types.h>

#include <string>

// Files that name a process. Everything here throws Failure.
namespace tavicore {

// The process id, 0 when there is none in the file, and the time at which that process started, if
// the file says so. The age of the file would not do: appliances set their clock after boot.
struct PidFile {
    pid_t pid;
    std::string startTime;  // clock ticks since boot
};

PidFile ReadPidFile(const char* file);

// Puts a file with the id and the start time of a running process in the place of what is there.
void WritePidFile(const char* file, pid_t pid);

// Throws VEXAC_ERR_NOT_FOUND when the process is not there any more.
void RequireAlive(const PidFile& process);

}  // namespace tavicore

#endif
