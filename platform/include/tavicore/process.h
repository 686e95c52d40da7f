/* SPDX-License-Identifier: MIT */
/*
 * Processes: running a program, and processes known by their pid file.
 *
 * A pid file holds a process id in decimal on its first line. One that VEXACProcPidFileCreate wrote
 * has a second line with the time at which that process started, in clock ticks since boot as the
 * kernel reports it ("/proc/PID/stat"). A process id that now belongs to another program has
 * another start time, so a stale pid file of ours never makes that program be taken for ours; for
 * pid files of other writers the id alone counts.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_PROCESS_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_PROCESS_H

#include <sys/types.h>
#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/*
 * Runs program (a path, or a name looked up in PATH) with the arguments that follow it, up to a
 * null, without a shell, and waits for it to end. It gets /dev/null as standard input, shares the
 * other standard descriptors and inherits no further descriptor. Returns the program's exit status
 * (0 is success), or -1 when it could not be run or was ended by a signal; also while the caller
 * ignores SIGCHLD. The program's parent is a process in between.
 */
TAVI_SDK_API int VEXACExec(const char* program, ...) __attribute__((sentinel));

/*
 * Forks a child that the caller need not wait for: it never becomes a zombie of the caller.
 * Returns 0 in the child, the child's process id in the caller, or -1 (VEXAC_ERR_FORK_FAILED).
 */
TAVI_SDK_API pid_t VEXACProcForkChildNoWait(void);

/*
 * Writes the calling process's id (and start time) into file, in one step, with mode 0644 less the
 * process's umask. Returns 0, or -1 (VEXAC_ERR_IO).
 */
TAVI_SDK_API int VEXACProcPidFileCreate(const char* file);

/*
 * Returns 1 when the process named in the pid file is alive (a zombie is not), else 0; also 0 when
 * there is no such file, or when its process id now belongs to another program.
 */
TAVI_SDK_API int VEXACProcAliveByPidFile(const char* file);

/*
 * Sends signal to the process named in the pid file. Returns 0; -1 with VEXAC_ERR_NOT_FOUND when
 * there is no such file or process, or the process id now belongs to another program; -1 with
 * VEXAC_ERR_IO when the signal may not be sent.
 */
TAVI_SDK_API int VEXACProcSignalByPidFile(const char* file, int signal);

/*
 * Returns the process id in the pid file; 0 when the file holds no positive number, or has a start
 * time and its process is not there any more; -1 when that cannot be told (VEXAC_ERR_NOT_FOUND
 * without a file).
 */
TAVI_SDK_API pid_t VEXACReadPidFile(const char* file);

#ifdef __cplusplus
}
#endif

#endif
