// SPDX-License-Identifier: MIT
#include "cli/doctor/processes.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace taviwireless::cli {

namespace {

namespace fs = std::filesystem;

std::string TextOf(const fs::path& path) {
    std::ifstream file(path);
    return {std::istreambuf_iterator<char>(file), {}};
}

}  // namespace

std::vector<RunningProcess> RunningProcesses() {
    std::vector<RunningProcess> processes;
    std::error_code none;
    for (const auto& entry : fs::directory_iterator("/proc", none)) {
        const std::string pid = entry.path().filename();
        if (pid.find_first_not_of("0123456789") == std::string::npos) {
            std::string name = TextOf(entry.path() / "comm");
            std::string arguments = TextOf(entry.path() / "cmdline");
            name.erase(std::min(name.find('\n'), name.size()));
            std::replace(arguments.begin(), arguments.end(), '\0', ' ');
            processes.push_back({std::stoi(pid), name, arguments});
        }
    }
    return processes;
}

bool HasOpen(const RunningProcess& process, const std::string& path) {
    std::error_code none;
    const fs::path file = fs::canonical(path, none);
    const fs::path folder = "/proc/" + std::to_string(process.pid) + "/fd";
    for (fs::directory_iterator entry(folder, none), end; !none && entry != end;
         entry.increment(none)) {
        std::error_code isGone;
        if (fs::read_symlink(entry->path(), isGone) == file) {
            return true;
        }
    }
    return false;
}

}  // namespace taviwireless::cli
