// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_COMMAND_LINE_COMMAND_LINE_H
#define TAVIWIRELESS_BASE_COMMAND_LINE_COMMAND_LINE_H

#include <functional>
#include <map>
#include <stdexcept>
#include <string>
#include <vector>

// What a program understands on its command line. CLI11 reads it: a header that takes five seconds
// to compile, so that nothing outside this folder includes it.
namespace CLI {
class App;
class Option;
}  // namespace CLI

namespace taviwireless {

// An option, a flag or a positional argument of a command. Each function returns it again.
class Argument {
  public:
    explicit Argument(CLI::Option* option) : option_(option) {}

    Argument& Required();
    // What the value may be; only the help of OneOf lists that.
    Argument& Between(int first, int last);
    Argument& ExistingFolder();
    Argument& OneOf(const std::vector<std::string>& words);
    Argument& Needs(const Argument& other);
    Argument& Excludes(const Argument& other);

  private:
    CLI::Option* option_;
};

// What the arguments of a name may be now, such as the names of things that are there.
using ArgumentValues = std::map<std::string, std::function<std::vector<std::string>()>>;

// The program itself, a group of commands, or a command. What describes it is a sentence without
// its full stop; lists show what stands before its first semicolon.
class Command {
  public:
    explicit Command(CLI::App* app) : app_(app) {}

    // A command that one of those in it has to follow.
    Command AddGroup(const char* name, const char* description) const;
    Command AddCommand(const char* name, const char* description, std::function<void()> run) const;
    void RequireCommand() const;

    // Names are such as "-m,--modem", or "ID" for a positional argument. The value outlives the
    // reading. It is a std::string, an unsigned, a std::optional<int>, or a
    // std::vector<std::string> for what may be repeated; the help calls it `type`.
    template <typename Value>
    Argument AddOption(const char* names, Value& value, const char* description,
                       const char* type = "TEXT") const;
    Argument AddFlag(const char* names, bool& value, const char* description) const;
    void AddFlag(const char* names, std::function<void()> run, const char* description) const;

    void SetVersion(const std::string& text) const;
    void SetFooter(const std::string& text) const;  // of the help

    // Adds a command that no help shows, which prints what the last of the words behind "--" may
    // become, a line each: for the completion of a shell, which gives the words as they were typed.
    void AddCompletion(const char* name, const ArgumentValues& valuesOf) const;

  private:
    CLI::App* app_;
};

// A command line that is not understood: what is wrong, and which help tells more.
struct UsageError : std::runtime_error {
    using runtime_error::runtime_error;
};

// Sets the values of the command line that `define` describes, then runs its command. Options of
// the program and of groups may stand behind their commands as well. Returns false when help or
// version was printed, on standard output, whose state the caller looks at.
bool ReadCommandLine(int argc, char** argv, const char* name, const char* description,
                     const std::function<void(const Command& program)>& define);

}  // namespace taviwireless

#endif
