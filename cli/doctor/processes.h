// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_DOCTOR_PROCESSES_H
#define TAVIWIRELESS_CLI_DOCTOR_PROCESSES_H

#include <string>
#include <vector>

namespace taviwireless::cli {

struct RunningProcess {
    int pid;
    std::string name;
    std::string arguments;  // with blanks between them
};

// All that may be seen.
std::vector<RunningProcess> RunningProcesses();

// Whether the process has the file open; only root can tell that of others' processes.
bool HasOpen(const RunningProcess& process, const std::string& path);

}  // namespace taviwireless::cli

#endif
