// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_SHELL_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_SHELL_H

#include <sys/types.h>

#include <cstddef>
#include <initializer_list>
#include <string>

#include "base/file_name.h"
#include "base/unique_fd.h"
#include "base/unique_file.h"

namespace taviwireless::wireless {

// Foreign text in a command: an ESSID, a key, an address. The shell splits it at blanks and does
// nothing else with it, whatever it holds.
struct Argument {
    std::string text;
    bool isSecret = false;  // stars stand for it in log lines
};

// Where the output of a command goes: to the caller's, or nowhere.
enum class Output { kShown, kDropped };

// A shell command, made of parts that stand as they are and arguments. It runs with no input, no
// signal blocked or ignored, in the root folder, and with no descriptor of the caller but where its
// output goes: programs that it leaves in the background live longer than the caller.
class Command {
  public:
    struct Part {
        Part(const char* literal) : text(literal) {}
        Part(const Argument& argument)
            : text(argument.text), isArgument(true), isSecret(argument.isSecret) {}
        std::string text;
        bool isArgument = false;
        bool isSecret = false;
    };

    // size is that of the buffer that the command, as it is described, must fit in; one that does
    // not is never run.
    Command(size_t size, std::initializer_list<Part> parts);

    // The command with its arguments as they are, secret ones hidden, for log lines.
    const std::string& Described() const { return described_; }

    // Runs it and waits. False, with a line in the log, when it could not be run; what the command
    // itself returned is not looked at. file and line are those of the log line.
    bool Run(Output output, const char* file, int line) const;

  private:
    friend class Pipe;
    // The process that runs it, which writes into the pipe if there is one; negative, with errno,
    // when there is none.
    pid_t Start(Output output, int pipe) const;

    bool fits_ = true;
    std::string described_;
    std::string text_;
};

// A command that is read from.
class Pipe {
  public:
    explicit Pipe(const Command& command);
    ~Pipe() { Close(); }
    Pipe(const Pipe&) = delete;
    Pipe& operator=(const Pipe&) = delete;

    // Whether the command runs; if not, errno tells why.
    explicit operator bool() const { return file_ != nullptr; }
    FILE* get() const { return file_.get(); }

    // Waits for the command's end and returns its exit status; -1 when it has none or that cannot
    // be told.
    int Close();

  private:
    UniqueFd readEnd_;
    UniqueFile file_;
    pid_t process_ = -1;
};

}  // namespace taviwireless::wireless

// Runs a command; a failure is logged under the name of the calling file.
#define TAVI_RUN(command) (command).Run(Output::kShown, __FILE_NAME__, __LINE__)
#define TAVI_RUN_SILENTLY(command) (command).Run(Output::kDropped, __FILE_NAME__, __LINE__)

#endif
