#ifndef TAVIWIRELESS_WIRELESS_SHELL_H
#define TAVIWIRELESS_WIRELESS_SHELL_H

#include <cstddef>
#include <cstdio>
#include <initializer_list>
#include <memory>
#include <string>

namespace taviwireless::wireless {

// A text of others in a command: an ESSID, a key, an address. The shell splits it at blanks and
// does nothing else with it, whatever it holds.
struct Argument {
    std::string text;
    bool isSecret = false;  // stars stand for it in log lines
};

// A shell command, made of parts that stand as they are and arguments.
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

    // size is that of the buffer that the command, as it is described, must fit in; what does not
    // is cut off.
    Command(size_t size, std::initializer_list<Part> parts);

    // The command with its arguments as they are, secret ones hidden, for log lines.
    const std::string& Described() const { return described_; }
    // What the shell is given.
    const std::string& Text() const { return text_; }

    // Runs it and waits. False, with a line in the log, when no shell could be run; what the
    // command itself returned is not looked at. file and line are those of the log line.
    bool Run(const char* file, int line) const;
    // The same with all of its output dropped, even where the shell does not know a redirection.
    bool RunSilently(const char* file, int line) const;

  private:
    std::string described_;
    std::string text_;
};

// A command that is read from, closed with the object.
using Pipe = std::unique_ptr<FILE, int (*)(FILE*)>;
Pipe OpenPipe(const Command& command);

}  // namespace taviwireless::wireless

// Runs a command; a failure is logged under the name of the calling file.
#define TAVI_RUN(command) (command).Run(__FILE_NAME__, __LINE__)
#define TAVI_RUN_SILENTLY(command) (command).RunSilently(__FILE_NAME__, __LINE__)

#endif
