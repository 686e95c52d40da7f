// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_COMPLETED_ARGUMENTS_H
#define TAVIWIRELESS_CLI_COMPLETED_ARGUMENTS_H

#include "base/command_line/command_line.h"

namespace taviwireless::cli {

// What a shell offers for the arguments, by what the commands call these. Read from files that this
// user may read: no modem and no service is asked.
ArgumentValues CompletedArguments();

}  // namespace taviwireless::cli

#endif
