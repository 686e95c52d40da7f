// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_DOCTOR_DOCTOR_COMMAND_H
#define TAVIWIRELESS_CLI_DOCTOR_DOCTOR_COMMAND_H

#include "cli/options.h"

namespace taviwireless::cli {

// Looks at everything that a connection needs, and prints a line for each. Ends the program with
// kFailure when something has failed.
void Examine(const Options& options);

}  // namespace taviwireless::cli

#endif
