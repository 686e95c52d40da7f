// taviwireless: the library's functions for a person or a script.
#include <signal.h>

#include "cli/command_line.h"

int main(int argc, char** argv) {
    signal(SIGCHLD, SIG_DFL);  // what started this may ignore it, and then no program has a result
    return taviwireless::cli::RunCommandLine(argc, argv);
}
