// SPDX-License-Identifier: MIT
#include "cli/modem/port_trouble.h"

#include <grp.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <vector>

#include "base/split.h"
#include "base/trusted_file.h"
#include "cli/modem/session_bus.h"
#include "cli/terminal.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::cli {

namespace {

using usbmodem_lib::kPortPrefix;

constexpr char kServiceProgram[] = "usbmodemd";

struct Ports {
    std::string dial;
    std::vector<std::string> all;
};

// The ports' device paths by the modem's info file.
Ports PortsOf(const std::string& id) {
    const int number = usbmodem_lib::InterfaceIdIn(id, "usbmodem").value_or(-1);
    const std::string path = usbmodem_lib::InfoPath(number);
    Ports ports;
    for (const std::string& line : Lines(ReadTrusted(path).value_or(""))) {
        const size_t equals = std::min(line.find('='), line.size());
        const std::string key = line.substr(0, equals);
        for (const std::string& port : Split(line.substr(equals).erase(0, 1), ',')) {
            if (key == "CONNECTNODE") {
                ports.dial = kPortPrefix + port;
            } else if (key == "DEVICENODE") {
                ports.all.push_back(kPortPrefix + port);
            }
        }
    }
    return ports;
}

// What lets somebody use what this is the status of, besides being root.
std::string WhoMay(const struct stat& status) {
    const struct group* group = getgrgid(status.st_gid);
    const std::string name = group != nullptr ? group->gr_name : std::to_string(status.st_gid);
    const bool helps = (status.st_mode & (S_IRGRP | S_IWGRP)) == (S_IRGRP | S_IWGRP);
    return helps ? "root or a member of group " + name : "root";
}

// By the lock file, which its owner leaves behind when it is killed.
std::optional<PortHolder> HolderOfPort(const std::string& port, const std::string& id) {
    const auto lock = ReadTrusted(usbmodem_lib::LockPath(port.substr(port.rfind('/') + 1)));
    const int pid = lock ? atoi(lock->c_str()) : 0;
    std::string program;
    std::ifstream comm("/proc/" + std::to_string(pid) + "/comm");
    if (pid <= 0 || pid == getpid() || !std::getline(comm, program)) {
        return std::nullopt;
    }
    const bool isService = program == kServiceProgram;
    const std::string who = isService ? "the modem service" : Printable(program);
    return PortHolder{isService, who + " (process " + std::to_string(pid) + ") holds " + port +
                                     " of " + id + "; end it" +
                                     (isService ? ", or leave --direct out" : "")};
}

}  // namespace

std::optional<CommandError> PortTrouble(const std::string& id) {
    std::string trouble;
    for (const std::string& port : PortsOf(id).all) {
        struct stat status {};
        const bool isThere = stat(port.c_str(), &status) == 0;
        if (isThere && access(port.c_str(), R_OK | W_OK) == 0) {
            return std::nullopt;
        }
        if (isThere) {
            trouble = "you may not use " + port + " of " + id + ": that takes " + WhoMay(status);
        } else if (trouble.empty()) {
            trouble = "modem " + id + " is not ready: its port " + port + " is not there" +
                      "; unplug it and plug it in again";
        }
    }
    return trouble.empty() ? std::nullopt : std::optional(CommandError(kFailure, trouble));
}

std::string StateFolderTrouble() {
    const char* path = usbmodem_lib::kStateDirectory;
    if (access(path, R_OK | W_OK | X_OK) == 0 || errno == ENOENT) {
        return "";
    }
    return std::string(path) + ": " + strerror(errno) +
           (geteuid() != 0 ? " (that takes root)" : "");
}

std::optional<PortHolder> HolderOfPorts(const std::string& id) {
    const Ports ports = PortsOf(id);
    std::optional<PortHolder> holder;
    bool isAnyFree = false;
    for (const std::string& port : ports.all) {
        if (port == ports.dial) {
            continue;  // the dialler's, and nobody is asked there
        }
        const auto found = HolderOfPort(port, id);
        isAnyFree = isAnyFree || (!found && access(port.c_str(), F_OK) == 0);
        if (found && (!holder || found->isService)) {
            holder = found;
        }
    }
    if (holder && (holder->isService || !isAnyFree)) {
        return holder;
    }
    if (IsServiceThere()) {
        return PortHolder{true, "the modem service is running, and holds the ports of " + id +
                                    "; end it, or leave --direct out"};
    }
    return std::nullopt;
}

}  // namespace taviwireless::cli
