// SPDX-License-Identifier: MIT
// taviwireless, the library's functions for a person or a script.
#include <fcntl.h>
#include <signal.h>
#include <stdio.h>
#include <syslog.h>
#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <iterator>
#include <new>
#include <string>

#include "cli/command_error.h"
#include "cli/command_lines.h"
#include "cli/completed_arguments.h"
#include "cli/report.h"
#include "cli/terminal.h"
#include "usbmodem/rules/trace.h"

namespace taviwireless::cli {

namespace {

constexpr char kAllGroups[] = "";
constexpr char kFooter[] =
    "taviwireless help COMMAND tells more of a command.\n"
    "With --json, a failure is {\"error\": SENTENCE} on standard output.\n"
    "Details of failures are in the system log; --verbose shows them here as well.\n"
    "\n"
    "Exit status:\n"
    "  0  done\n"
    "  1  failed\n"
    "  2  wrong usage\n"
    "  3  no such modem or network\n"
    "  4  busy: it has a connection already, or is connecting\n"
    "  5  the modem service is not running\n";

struct Group {
    const char* name;
    void (*add)(const Command& program, Options& options);
};
constexpr Group kGroups[] = {{"modem", AddModemCommands},
                             {"wifi", AddWifiCommands},
                             {"ap", AddAPCommands},
                             {"doctor", AddDoctorCommand}};

// All groups, or the one of this name.
void Define(const Command& program, Options& options, const std::string& only) {
    program.SetVersion("taviwireless " TAVI_VERSION);
    program.AddFlag("--json", options.json, "Print JSON instead of text");
    program
        .AddOption("--timeout", options.timeout,
                   "Longest time that a command may take, without that in which it reads input, in "
                   "seconds, from 1 to 3600",
                   "SECONDS")
        .Between(1, 3600);
    program.AddFlag(
        "-v,--verbose",
        [] {
            openlog("taviwireless", LOG_PERROR, LOG_USER);
            usbmodem_lib::SwitchTraceOn();
        },
        "Show what is done, and the library's log, on standard error");
    program.RequireCommand();
    for (const Group& group : kGroups) {
        if (only.empty() || only == group.name) {
            group.add(program, options);
        }
    }
    program.AddCompletion("complete-words", CompletedArguments());
    program.SetFooter(kFooter);  // of the program's help alone
}

// A descriptor that is closed would become that of the next file, or modem, that is opened: what is
// printed would be sent there.
void RequireOutput() {
    for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
        const bool isClosed = fcntl(descriptor, F_GETFD) < 0;
        if (isClosed && open("/dev/null", O_RDWR) == descriptor && descriptor == STDOUT_FILENO) {
            throw CommandError(kFailure, "standard output is closed; nothing was done");
        }
    }
}

void Read(int argc, char** argv, Options& options, const std::string& only) {
    ReadCommandLine(argc, argv, "taviwireless",
                    "Wireless connectivity of the appliance: USB modems and Wi-Fi",
                    [&](const Command& program) { Define(program, options, only); });
}

// To describe the other groups would take a fifth of the start.
void ReadQuickly(int argc, char** argv, Options& options) {
    const std::string first = argc > 1 ? argv[1] : "";
    const bool isGroup = std::any_of(std::begin(kGroups), std::end(kGroups),
                                     [&](const Group& group) { return first == group.name; });
    if (!isGroup && first != "--version") {
        Read(argc, argv, options, kAllGroups);
        return;
    }
    try {
        Read(argc, argv, options, first);
    } catch (const UsageError&) {
        Read(argc, argv, options, kAllGroups);  // fails as well, and knows where else a command is
    }
}

void RunCommandLine(int argc, char** argv, Options& options) {
    try {
        RequireOutput();
        ReadQuickly(argc, argv, options);
        FlushOutput();
    } catch (const UsageError& error) {
        options.json = std::count(argv, argv + argc, std::string("--json")) > 0;
        throw CommandError(kUsage, Printable(error.what()));
    }
}

}  // namespace

}  // namespace taviwireless::cli

int main(int argc, char** argv) {
    using namespace taviwireless::cli;
    signal(SIGCHLD, SIG_DFL);  // what started this may ignore it, and then no program has a result
    signal(SIGPIPE, [](int) {});  // not ignored, which programs that are started would inherit
    Options options;
    try {
        try {
            RunCommandLine(argc, argv, options);
            return kSuccess;
        } catch (const CommandError& error) {
            PrintFailure(options, error.what());
            return error.Status();
        } catch (const std::bad_alloc&) {
            PrintFailure(options, "there is not enough memory");
        } catch (const std::exception& error) {
            PrintFailure(options, std::string("failed: ") + error.what());
        }
    } catch (const std::bad_alloc&) {  // nor for the sentence
        fputs("taviwireless: there is not enough memory\n", stderr);
    }
    return kFailure;
}
