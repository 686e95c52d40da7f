// SPDX-License-Identifier: MIT
#include "tests/support/process.h"

#include <gtest/gtest.h>
#include <poll.h>
#include <sys/auxv.h>
#include <sys/wait.h>

#include <cerrno>
#include <csignal>
#include <filesystem>
#include <stdexcept>
#include <system_error>
#include <thread>
#include <utility>

#include "base/memory_file.h"
#include "base/spawn_settings.h"
#include "base/unique_pipe.h"

namespace taviwireless::test {
namespace {

using Clock = std::chrono::steady_clock;
using Milliseconds = Process::Milliseconds;

// Without /proc, which in an appliance root may know the test by another path.
std::filesystem::path BuiltPrograms() {
    const auto* test = reinterpret_cast<const char*>(getauxval(AT_EXECFN));
    return std::filesystem::canonical(test).parent_path();
}

[[noreturn]] void FailToStart() {
    throw std::system_error(errno, std::generic_category(), "Cannot start a program");
}

// Starts `argv` with these as 0, 1 and, unless it is negative, 2. Returns when the program runs: some
// cases look at its name.
pid_t Spawn(const std::vector<std::string>& argv, int input, int output, int error) {
    std::vector<const char*> arguments;
    for (const auto& argument : argv) {
        arguments.push_back(argument.c_str());
    }
    arguments.push_back(nullptr);
    SpawnSettings settings;
    settings.Duplicate(input, STDIN_FILENO);
    settings.Duplicate(output, STDOUT_FILENO);
    settings.Duplicate(error < 0 ? STDERR_FILENO : error, STDERR_FILENO);
    const pid_t pid = settings.Spawn(arguments[0], arguments.data());
    if (pid < 0) {
        FailToStart();
    }
    return pid;
}

// Appends what can be read now to `text`; false at the end.
bool ReadMore(int descriptor, std::string* text) {
    char buffer[4096];
    const ssize_t count = read(descriptor, buffer, sizeof buffer);
    if (count < 0) {
        return errno == EINTR || errno == EAGAIN;
    }
    text->append(buffer, count);
    return count > 0;
}

// The exit status once the child has ended; nothing when it has not by the deadline.
std::optional<int> WaitUntil(Clock::time_point deadline, pid_t pid) {
    int status = 0;
    while (waitpid(pid, &status, WNOHANG) != pid) {
        if (Clock::now() >= deadline) {
            return std::nullopt;
        }
        std::this_thread::sleep_for(Milliseconds(1));
    }
    return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

}  // namespace

std::string BuiltProgram(const std::string& name) {
    return BuiltPrograms() / name;
}

std::vector<std::string> WithShortWaits(std::vector<std::string> argv) {
#ifndef __SANITIZE_ADDRESS__  // which has to be loaded before everything else
    // Named without its folder, whose path may hold blanks, at which LD_PRELOAD is split.
    const std::string folder = BuiltPrograms().parent_path() / "lib";
    argv.insert(argv.begin(),
                {"env", "LD_LIBRARY_PATH=" + folder, "LD_PRELOAD=libtavi_short_waits.so"});
#endif
    return argv;
}

RunResult RunAsNobody(std::vector<std::string> argv) {
    // The program may lie in a folder that is closed to others.
    std::vector<std::string> nobody = {"setpriv",
                                       "--reuid=65534",
                                       "--regid=65534",
                                       "--clear-groups",
                                       "--inh-caps=+dac_read_search",
                                       "--ambient-caps=+dac_read_search"};
    const bool isOnlyUser = RunProgram({"setpriv", "--reuid=65534", "true"}).status != 0;
    if (isOnlyUser) {
        nobody = {"unshare", "--user", "--map-user=65534"};
    }
    argv.insert(argv.begin(), nobody.begin(), nobody.end());
    return RunProgram(argv);
}

Process::Process(const std::vector<std::string>& argv) {
    signal(SIGPIPE, SIG_IGN);  // one that no longer reads must show as a failed write
    UniquePipe input;
    UniquePipe output;
    if (!input || !output) {
        FailToStart();
    }
    pid_ = Spawn(argv, input.readEnd.Get(), output.writeEnd.Get(), -1);
    input_ = std::move(input.writeEnd);
    output_ = std::move(output.readEnd);
}

Process::~Process() {
    CloseInput();
    output_.Close();
    Signal(SIGKILL);
    Wait();
}

std::optional<std::string> Process::ReadLine(Milliseconds patience) {
    const auto deadline = Clock::now() + patience;
    for (;;) {
        const auto end = unread_.find('\n');
        if (end != std::string::npos) {
            std::string line = unread_.substr(0, end);
            unread_.erase(0, end + 1);
            return line;
        }
        if (atEnd_) {
            return unread_.empty() ? std::nullopt : std::optional(std::exchange(unread_, {}));
        }
        const auto left = std::chrono::ceil<Milliseconds>(deadline - Clock::now());
        pollfd readable{output_.Get(), POLLIN, 0};
        if (poll(&readable, 1, static_cast<int>(std::max(left, Milliseconds::zero()).count())) >
            0) {
            atEnd_ = !ReadMore(output_.Get(), &unread_);
        } else if (Clock::now() >= deadline) {
            return std::nullopt;
        }
    }
}

bool Process::WriteLine(const std::string& line) {
    const std::string text = line + "\n";  // far shorter than what a pipe takes in one piece
    return write(input_.Get(), text.data(), text.size()) == static_cast<ssize_t>(text.size());
}

void Process::Signal(int number) {
    if (!status_) {  // afterwards the number may be another process's
        kill(pid_, number);
    }
}

std::optional<int> Process::Wait(Milliseconds patience) {
    if (!status_) {
        status_ = WaitUntil(Clock::now() + patience, pid_);
    }
    return status_;
}

RunResult RunProgram(const std::vector<std::string>& argv, const std::string& input) {
    const UniqueFd in = MemoryFile(input);
    const UniqueFd out = MemoryFile();
    const UniqueFd err = MemoryFile();
    if (!in || !out || !err) {
        FailToStart();
    }
    const pid_t pid = Spawn(argv, in.Get(), out.Get(), err.Get());
    const auto status = WaitUntil(Clock::now() + Process::kPatience, pid);
    if (!status) {
        kill(pid, SIGKILL);
        waitpid(pid, nullptr, 0);
        throw std::runtime_error(argv[0] + " has not ended within 50 s");
    }
    return {*status, TextOf(out), TextOf(err)};
}

std::string Shell(const std::string& script) {
    const RunResult result = RunProgram({"sh", "-c", script});
    EXPECT_EQ(result.status, 0) << script << ": " << result.err;
    return result.out;
}

}  // namespace taviwireless::test
