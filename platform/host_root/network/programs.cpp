// SPDX-License-Identifier: MIT
#include "platform/host_root/network/programs.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <tavicore/process.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstring>
#include <fstream>
#include <iterator>

#include "base/memory_file.h"
#include "base/process_handle.h"
#include "base/spawn_settings.h"
#include "platform/host_root/network/error.h"
#include "platform/host_root/network/paths.h"

namespace taviwireless::network {

namespace {

constexpr char kStopProgram[] = "/usr/tavi/bin/stop-program";
constexpr int kStopLimit = 20;   // s; it ends by itself after half of that
constexpr int kStartLimit = 30;  // s; the DHCP client asks for 12

pid_t Spawn(const std::vector<std::string>& argv, int output) {
    std::vector<const char*> words;
    for (const std::string& word : argv) {
        words.push_back(word.c_str());
    }
    words.push_back(nullptr);
    SpawnSettings settings;
    settings.GiveGroupOfItsOwn();
    settings.OpenNothing(STDIN_FILENO);
    settings.Duplicate(output, STDOUT_FILENO);
    settings.Duplicate(output, STDERR_FILENO);
    settings.StartInRootFolder();
    settings.InheritNothingElse();
    return settings.Spawn(words[0], words.data());
}

// Whether it ends in time, with exit status 0.
bool EndsWell(pid_t pid, int limit) {
    const bool inTime = ProcessHandle(pid).AwaitEnd(std::chrono::seconds(limit));
    if (!inTime) {
        kill(-pid, SIGKILL);
    }
    // A process that the kernel does not let go of, even killed, is not waited for.
    int status = -1;
    return waitpid(pid, &status, inTime ? 0 : WNOHANG) == pid && inTime && WIFEXITED(status) &&
           WEXITSTATUS(status) == 0;
}

bool AwaitPidFile(const Program& program) {
    constexpr int kMostLooks = 5000;
    constexpr useconds_t kPause = 2000;  // µs
    struct stat status {};
    for (int i = 0; i < kMostLooks; ++i) {
        if (stat(program.pidFile.c_str(), &status) == 0 && status.st_size > 0) {
            return true;
        }
        usleep(kPause);
    }
    return false;
}

}  // namespace

Outcome Run(const std::vector<std::string>& argv, int limit) {
    const UniqueFd output = MemoryFile();
    const pid_t pid = output ? Spawn(argv, output.Get()) : -1;
    if (pid < 0) {
        return {false, argv[0] + ": " + strerror(errno) + '\n'};
    }
    const bool isDone = EndsWell(pid, limit);
    return {isDone, TextOf(output)};
}

Program Hostapd(const std::string& interface) {
    const std::string pidFile = HostapdPidFile(interface);
    const std::string conf = HostapdConf(interface);
    return {"hostapd", interface, pidFile, conf, {"hostapd", "-B", "-P", pidFile, conf}};
}

Program DhcpServer(const std::string& bridge) {
    const std::string conf = "/etc/dhcpd/dhcpd-" + bridge + '-' + bridge + ".conf";
    return {"udhcpd", bridge, DhcpServerPidFile(bridge), conf, {"udhcpd", "-S", conf}};
}

// The DHCP client. Without an answer after 12 s it goes on asking in the background.
Program DhcpClient(const std::string& interface) {
    const std::string pidFile = "/etc/dhcpc/dhcpcd-" + interface + ".pid";
    return {"udhcpc",
            interface,
            pidFile,
            "",
            {"udhcpc", "-S", "-b", "-t", "4", "-T", "3", "-i", interface, "-s",
             "/usr/tavi/bin/dhcp-lease", "-p", pidFile}};
}

bool Runs(const Program& program) {
    const pid_t pid = VEXACReadPidFile(program.pidFile.c_str());
    std::string name;
    return pid > 0 && VEXACProcAliveByPidFile(program.pidFile.c_str()) == 1 &&
           std::getline(std::ifstream("/proc/" + std::to_string(pid) + "/comm"), name) &&
           name == program.name;
}

void Start(const Program& program) {
    mkdir("/etc/dhcpc", 0755);  // it mostly exists
    const Outcome outcome = Run(program.start, kStartLimit);
    if (!outcome.isDone || !AwaitPidFile(program)) {
        throw Error(outcome.output);
    }
}

void Stop(const Program& program) {
    if (access(program.pidFile.c_str(), F_OK) != 0 && errno == ENOENT) {
        return;  // it did not run
    }
    const Outcome outcome = Run({kStopProgram, program.name, program.pidFile}, kStopLimit);
    if (!outcome.isDone) {
        throw Error("cannot end " + program.name + " on " + program.interface + ": " +
                    outcome.output);
    }
}

Kept Keep(const Program& program) {
    return {program, Runs(program), ReadText(program.conf)};
}

void PutBack(const Kept& kept) {
    if (kept.conf) {
        WriteText(kept.program.conf, *kept.conf);
    } else {
        unlink(kept.program.conf.c_str());
    }
    if (kept.ran && !Runs(kept.program)) {
        Start(kept.program);
    }
}

std::optional<std::string> ReadText(const std::string& path) {
    std::ifstream file(path);
    if (!file) {
        return std::nullopt;
    }
    return std::string(std::istreambuf_iterator<char>(file), {});
}

void WriteText(const std::string& path, const std::string& text) {
    unlink(path.c_str());
    const UniqueFd file(open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600));
    if (!file || write(file.Get(), text.data(), text.size()) != static_cast<ssize_t>(text.size())) {
        throw Error("cannot write " + path + ": " + strerror(errno));
    }
}

void ReplaceText(const std::string& path, const std::string& text) {
    const std::string draft = path + ".new";
    WriteText(draft, text);
    if (rename(draft.c_str(), path.c_str()) != 0) {
        throw Error("cannot write " + path);
    }
}

}  // namespace taviwireless::network
