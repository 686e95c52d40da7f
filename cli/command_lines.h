// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_COMMAND_LINES_H
#define TAVIWIRELESS_CLI_COMMAND_LINES_H

#include "base/command_line/command_line.h"
#include "cli/deadline.h"
#include "cli/options.h"

namespace taviwireless::cli {

using Run = void (*)(const Options& options);

// Adds a command, which may take the time of --timeout. The options outlive the reading of the
// command line.
inline Command Add(const Command& group, const char* name, const char* description,
                   Options& options, Run run) {
    return group.AddCommand(name, description,
                            [&options, run] { Deadline(options).Limit([&] { run(options); }); });
}

// Adds a command that ends itself at the time of --timeout: there is something to undo.
inline Command AddSelfTimed(const Command& group, const char* name, const char* description,
                            Options& options, Run run) {
    return group.AddCommand(name, description, [&options, run] { run(options); });
}

// The groups of commands that the program has.
void AddModemCommands(const Command& program, Options& options);
void AddWifiCommands(const Command& program, Options& options);
void AddAPCommands(const Command& program, Options& options);
void AddDoctorCommand(const Command& program, Options& options);

}  // namespace taviwireless::cli

#endif
