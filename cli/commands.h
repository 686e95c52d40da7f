#ifndef TAVIWIRELESS_CLI_COMMANDS_H
#define TAVIWIRELESS_CLI_COMMANDS_H

#include <stdexcept>
#include <string>

namespace CLI {
class App;
}

namespace taviwireless::cli {

// What the program ends with.
enum ExitStatus { kSuccess = 0, kFailure = 1, kUsage = 2, kNotFound = 3, kBusy = 4 };

// A failure to report: one plain sentence, and what the program ends with.
class CommandError : public std::runtime_error {
  public:
    CommandError(ExitStatus status, const std::string& sentence)
        : std::runtime_error(sentence), status_(status) {}
    ExitStatus Status() const { return status_; }

  private:
    ExitStatus status_;
};

// Options of every command.
struct Options {
    bool json = false;
};

// Each adds a group of commands. A command runs while the arguments are parsed and throws
// CommandError when it fails.
void AddModemCommands(CLI::App& app, const Options& options);
void AddConnectionCommands(CLI::App& modem, const Options& options);
void AddProfileCommands(CLI::App& modem, const Options& options);

}  // namespace taviwireless::cli

#endif
