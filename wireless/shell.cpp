#include "wireless/shell.h"

#include <fcntl.h>
#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>

#include <cstdlib>

#include "common/log.h"

namespace taviwireless::wireless {

namespace {

// A quote for every character that a shell could act on; blanks still split.
std::string Quoted(char c) {
    constexpr char kActive[] = "|&;<>()$`\\\"'*?[]#~=%!{}^";
    if (c == '\n') {
        return "'\n'";  // behind a backslash it would vanish
    }
    const bool isActive = c != '\0' && std::string(kActive).find(c) != std::string::npos;
    return isActive ? std::string("\\") + c : std::string(1, c);
}

void LogFailure(const char* file, int line, const std::string& command) {
    WriteLog(LOG_ERR, file, line, "Failed to execute '%s'", command.c_str());
}

}  // namespace

Command::Command(size_t size, std::initializer_list<Part> parts) {
    for (const Part& part : parts) {
        for (const char c : part.text) {
            if (described_.size() + 1 == size) {
                return;
            }
            described_ += part.isSecret ? '*' : c;
            text_ += part.isArgument ? Quoted(c) : std::string(1, c);
        }
    }
}

bool Command::Run(const char* file, int line) const {
    if (system(text_.c_str()) < 0) {
        LogFailure(file, line, described_);
        return false;
    }
    return true;
}

bool Command::RunSilently(const char* file, int line) const {
    const pid_t child = fork();
    if (child == 0) {
        const int nothing = open("/dev/null", O_RDWR);
        dup2(nothing, STDOUT_FILENO);
        dup2(nothing, STDERR_FILENO);
        execl("/bin/sh", "sh", "-c", text_.c_str(), nullptr);
        _exit(127);
    }
    if (child < 0 || TEMP_FAILURE_RETRY(waitpid(child, nullptr, 0)) < 0) {
        LogFailure(file, line, described_);
        return false;
    }
    return true;
}

Pipe OpenPipe(const Command& command) {
    return Pipe(popen(command.Text().c_str(), "r"), pclose);
}

}  // namespace taviwireless::wireless
