// SPDX-License-Identifier: MIT
// appliance-root: runs a command in an appliance root.
#include <getopt.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <exception>

#include "platform/appliance_root/appliance_root.h"

namespace {

constexpr int kUsageError = 2;
constexpr int kNotFound = 127;  // as a shell answers
constexpr int kNotRunnable = 126;

constexpr char kHelp[] =
    "Usage: appliance-root [--output FOLDER] [--] COMMAND [ARGUMENT...]\n"
    "\n"
    "Runs COMMAND in a private copy of this machine that looks like the appliance:\n"
    "/tmp, /run, /var/tmp, /dev and the network are new and empty, changes to /etc,\n"
    "/usr and /var vanish with it, and nothing else can be written, but for FOLDER.\n"
    "What COMMAND leaves running is killed when it ends.\n"
    "The exit status is the command's, 128+N when signal N killed it, 70 when the\n"
    "private copy cannot be made.\n";

}  // namespace

int main(int argc, char** argv) {
    const option options[] = {
        {"help", no_argument, nullptr, 'h'}, {"output", required_argument, nullptr, 'o'}, {}};
    const char* output = "";
    // "+": the options behind COMMAND are its own.
    for (int found; (found = getopt_long(argc, argv, "+h", options, nullptr)) != -1;) {
        if (found == 'h') {
            fputs(kHelp, stdout);
            return 0;
        }
        if (found != 'o') {
            return kUsageError;  // getopt_long has named what is wrong
        }
        output = optarg;
    }
    char** command = argv + optind;
    if (*command == nullptr) {
        fputs("appliance-root: no command given, see --help\n", stderr);
        return kUsageError;
    }
    try {
        taviwireless::EnterApplianceRoot(output);
    } catch (const std::exception& error) {
        fprintf(stderr, "%s\n", error.what());
        return taviwireless::kApplianceRootFailed;
    }
    execvp(*command, command);
    const int status = errno == ENOENT ? kNotFound : kNotRunnable;
    fprintf(stderr, "appliance-root: cannot run %s: %s\n", *command, strerror(errno));
    return status;
}
