// taviwireless: the library's functions for a person or a script.
#include <signal.h>
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <iostream>

#include "cli/commands.h"
#include "cli/output.h"

using namespace taviwireless::cli;

namespace {

constexpr char kFooter[] =
    "Exit status: 0 done, 1 failed, 2 wrong usage, 3 no such modem or network, 4 busy: it "
    "has a connection already, or is connecting; 5 the modem service is not running.\n"
    "With --json, a failure is {\"error\": SENTENCE} on standard output.\n"
    "Details of failures are in the system log; --verbose shows them here as well.";

int Fail(const Options& options, ExitStatus status, const std::string& sentence) {
    PrintFailure(options.json, sentence);
    return status;
}

}  // namespace

int main(int argc, char** argv) {
    signal(SIGCHLD, SIG_DFL);  // what started this may ignore it, and then no program has a result
    CLI::App app("Wireless connectivity of the appliance: USB modems and Wi-Fi", "taviwireless");
    Options options;
    app.set_version_flag("--version", "taviwireless " TAVI_VERSION);
    app.add_flag("--json", options.json, "Print JSON instead of tables");
    app.add_flag_callback(
        "-v,--verbose", [] { openlog("taviwireless", LOG_PERROR, LOG_USER); },
        "Show the library's log on standard error as well");
    app.footer(kFooter);
    app.require_subcommand(1);
    app.fallthrough();
    AddModemCommands(app, options);
    AddWifiCommands(app, options);
    AddAPCommands(app, options);
    try {
        app.parse(argc, argv);
        return std::cout.flush() ? kSuccess : Fail(options, kFailure, "cannot write the output");
    } catch (const CLI::ParseError& error) {
        if (error.get_exit_code() == static_cast<int>(CLI::ExitCodes::Success)) {
            return app.exit(error);  // --help, --version
        }
        return Fail(options, kUsage, std::string(error.what()) + "; see taviwireless --help");
    } catch (const CommandError& error) {
        return Fail(options, error.Status(), error.what());
    }
}
