// appliance-root: runs a command in an appliance root.
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <exception>

#include "platform/root/appliance_root.h"

namespace {

constexpr int kUsageError = 2;
constexpr int kNotFound = 127;  // as a shell answers
constexpr int kNotRunnable = 126;

constexpr char kHelp[] =
    "Usage: appliance-root [--] COMMAND [ARGUMENT...]\n"
    "\n"
    "Runs COMMAND in a private copy of this machine that looks like the appliance:\n"
    "/tmp, /run, /var/tmp, /dev and the network are new and empty, changes to /etc,\n"
    "/usr and /var vanish with it. What COMMAND leaves running is killed when it ends.\n"
    "The exit status is the command's, 128+N when signal N killed it, 70 when the\n"
    "private copy cannot be made.\n";

}  // namespace

int main(int argc, char** argv) {
    char** command = argv + 1;
    if (argc > 1 && (strcmp(*command, "--help") == 0 || strcmp(*command, "-h") == 0)) {
        fputs(kHelp, stdout);
        return 0;
    }
    if (argc > 1 && strcmp(*command, "--") == 0) {
        ++command;
    } else if (argc > 1 && **command == '-') {
        fprintf(stderr, "appliance-root: unknown option %s, see --help\n", *command);
        return kUsageError;
    }
    if (argc < 2 || *command == nullptr) {
        fputs("appliance-root: no command given, see --help\n", stderr);
        return kUsageError;
    }
    try {
        taviwireless::EnterApplianceRoot();
    } catch (const std::exception& error) {
        fprintf(stderr, "%s\n", error.what());
        return taviwireless::kApplianceRootFailed;
    }
    execvp(*command, command);
    const int status = errno == ENOENT ? kNotFound : kNotRunnable;
    fprintf(stderr, "appliance-root: cannot run %s: %s\n", *command, strerror(errno));
    return status;
}
