// taviwireless, the library's functions for a person or a script.
#include <locale.h>
#include <signal.h>
#include <stdio.h>
#include <syslog.h>

#include <iostream>
#include <new>

#include "cli/command_error.h"
#include "cli/command_lines.h"
#include "cli/report.h"
#include "usbmodem/rules/trace.h"

namespace taviwireless::cli {

namespace {

constexpr char kFooter[] =
    "Exit status: 0 done, 1 failed, 2 wrong usage, 3 no such modem or network, 4 busy: it "
    "has a connection already, or is connecting; 5 the modem service is not running.\n"
    "With --json, a failure is {\"error\": SENTENCE} on standard output.\n"
    "Details of failures are in the system log; --verbose shows them here as well.";

void Define(const Command& program, Options& options) {
    program.SetVersion("taviwireless " TAVI_VERSION);
    program.AddFlag("--json", options.json, "Print JSON instead of tables");
    program.AddFlag(
        "-v,--verbose",
        [] {
            openlog("taviwireless", LOG_PERROR, LOG_USER);
            usbmodem_lib::SwitchTraceOn();
        },
        "Show what is done, and the library's log, on standard error");
    program.SetFooter(kFooter);
    program.RequireCommand();
    AddModemCommands(program, options);
    AddWifiCommands(program, options);
    AddAPCommands(program, options);
}

void RunCommandLine(int argc, char** argv, Options& options) {
    try {
        const bool isRun =
            ReadCommandLine(argc, argv, "taviwireless",
                            "Wireless connectivity of the appliance: USB modems and Wi-Fi",
                            [&](const Command& program) { Define(program, options); });
        if (isRun && !std::cout.flush()) {
            throw CommandError(kFailure, "cannot write the output");
        }
    } catch (const UsageError& error) {
        throw CommandError(kUsage, std::string(error.what()) + "; see taviwireless --help");
    }
}

}  // namespace

}  // namespace taviwireless::cli

int main(int argc, char** argv) {
    using namespace taviwireless::cli;
    setlocale(LC_CTYPE, "");   // which characters the terminal can show
    signal(SIGCHLD, SIG_DFL);  // what started this may ignore it, and then no program has a result
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
