// SPDX-License-Identifier: MIT
// modemsim: simulated USB 3G modems on real serial lines.
#include <signal.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <stdexcept>

#include "base/command_line/command_line.h"
#include "base/split.h"
#include "sim/control.h"
#include "sim/simulator.h"
#include "sim/user_text.h"

namespace {

using namespace taviwireless;
using namespace taviwireless::sim;

constexpr int kFailed = 1;
constexpr int kBadUsage = 2;

struct Options {
    std::vector<std::string> modems;
    std::vector<std::string> ttys;
    std::string onDial;
    std::vector<std::string> faults;
    Places places;
    bool control = false;
    std::string log;
};

std::string Footer() {
    std::string known;
    for (const auto& name : Personality::Known()) {
        known += " " + name;
    }
    return "A modem is written PERSONALITY[,NAME=VALUE]... Personalities:" + known +
           ", or the path of a JSON file like them (with a / in it). NAME is one of\n"
           "  id=N               the number in usbmodem.infoN (the next free one)\n"
           "  ports=N or ROLES   that many ports, or roles such as dial/mute/at, in order\n"
           "  pin=PIN            a SIM card that asks for this PIN; with lock=off it does not\n"
           "  puk=, attempts=, puk_attempts=, sim=ready|absent|busy|failure\n"
           "  fault=FAULT        misbehaves from the start\n"
           "  imsi, operator, apn, signal, roaming=yes|no, vendor, product ...  variables of the "
           "personality\n"
           "Faults:\n" +
           FaultHelp() + "Control commands:\n" + Control::Help() +
           "Each is answered with ok or error.\n"
           "Exit status:\n"
           "  0  ended by a signal, or with --control by quit or the end of the input\n"
           "  1  failed\n"
           "  2  wrong usage\n"
           "Examples:\n"
           "  modemsim                                 one modem; prints its ports\n"
           "  modemsim --modem 12d1,pin=1234 --log -   a locked SIM card; shows what is said\n"
           "  modemsim --link-dir /dev --info-dir /tmp --modem 12d1 --modem 2001,id=5  two modems "
           "as plugged into this machine\n"
           "  modemsim --tty /dev/ttyGS0,/dev/ttyGS1   answers on a USB gadget's serial ports\n";
}

void Define(const Command& program, Options& options) {
    program.SetFooter(Footer());
    program.AddOption("-m,--modem", options.modems, "A modem; may be repeated (one generic modem)",
                      "MODEM");
    program.AddOption(
        "--tty", options.ttys,
        "Ttys to use instead of new pseudo-terminals; the first --tty is for the first "
        "--modem and so on; such a modem gets no links and no info file",
        "PATH[,PATH...]");
    program.AddOption(
        "--on-dial", options.onDial,
        "Run COMMAND with the line as its input and output when a connection is dialled; "
        "its end ends the connection",
        "COMMAND");
    const Argument linkDir =
        program
            .AddOption("--link-dir", options.places.linkDir,
                       "Link the ports as DIR/ttyUSB0 and so on, while this runs", "DIR")
            .ExistingFolder();
    program
        .AddOption("--first-port", options.places.firstPort, "Begin with this number instead of 0",
                   "N")
        .Between(0, 999);
    program
        .AddOption("--info-dir", options.places.infoDir,
                   "Write DIR/usbmodem.infoN for each modem, while this runs", "DIR")
        .ExistingFolder()
        .Needs(linkDir);
    program.AddOption("--fault", options.faults, "Make modem ID misbehave from the start",
                      "ID:FAULT");
    program.AddFlag("--control", options.control, "Take control commands from standard input");
    program.AddOption("--log", options.log,
                      "Append what is said to FILE (- for standard error), PINs included", "FILE");
}

void AddModems(const Options& options, Simulator& simulator) {
    std::vector<std::string> modems = options.modems;
    modems.resize(std::max({modems.size(), options.ttys.size(), size_t{1}}), "generic");
    for (size_t index = 0; index < modems.size(); ++index) {
        try {
            ModemDescription description = ParseModemDescription(modems[index]);
            description.onDial = options.onDial;
            if (index < options.ttys.size()) {
                description.ttys = Split(options.ttys[index], ',');
            }
            simulator.Add(description);
        } catch (const std::invalid_argument& error) {
            throw std::invalid_argument("Cannot use the modem '" + modems[index] +
                                        "': " + error.what() + ".");
        }
    }
}

void AddFaults(const Options& options, Simulator& simulator) {
    Control control(simulator);
    for (const auto& fault : options.faults) {
        const size_t colon = fault.find(':');
        if (colon == std::string::npos) {
            throw std::invalid_argument("--fault takes ID:FAULT, not '" + fault + "'.");
        }
        try {
            control.AddFault(fault.substr(0, colon), fault.substr(colon + 1));
        } catch (const std::invalid_argument& error) {
            throw std::invalid_argument("Cannot use --fault '" + fault + "': " + error.what() +
                                        ".");
        }
    }
}

// Readable when this program is told to end, so that links and info files are removed then.
UniqueFd EndSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    for (const int number : {SIGINT, SIGTERM, SIGHUP}) {
        sigaddset(&signals, number);
    }
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    signal(SIGPIPE, SIG_IGN);
    return UniqueFd(signalfd(-1, &signals, SFD_CLOEXEC));
}

// Carries out the commands of standard input; returns when it ends or says quit.
void RunControl(Simulator& simulator, int stop) {
    Control control(simulator);
    std::string typed;
    char buffer[4096];
    while (simulator.ServeUntil(STDIN_FILENO, stop)) {
        const ssize_t count = read(STDIN_FILENO, buffer, sizeof buffer);
        if (count <= 0) {
            return;
        }
        typed.append(buffer, static_cast<size_t>(count));
        for (size_t end; (end = typed.find('\n')) != std::string::npos;) {
            std::cout << control.Execute(typed.substr(0, end)) << std::flush;
            typed.erase(0, end + 1);
            if (control.Quits()) {
                return;
            }
        }
    }
}

void Run(const Options& options) {
    const UniqueFd stop = EndSignals();
    Simulator simulator(options.places,
                        options.log.empty() ? Transcript() : Transcript(options.log));
    AddModems(options, simulator);
    AddFaults(options, simulator);
    for (const auto& modem : simulator.Modems()) {
        std::cout << modem->Describe();
    }
    std::cout << "ready" << std::endl;
    if (options.control) {
        RunControl(simulator, stop.Get());
    } else {
        simulator.ServeUntil(-1, stop.Get());
    }
}

}  // namespace

int main(int argc, char** argv) {
    Options options;
    try {
        if (ReadCommandLine(argc, argv, "modemsim",
                            "Simulates USB 3G modems on serial lines, until a signal ends it.",
                            [&](const Command& program) { Define(program, options); })) {
            Run(options);
        }
        return 0;
    } catch (const UsageError& error) {
        std::cerr << "modemsim: " << error.what() << "\n";
        return kBadUsage;
    } catch (const std::invalid_argument& error) {
        std::cerr << "modemsim: " << error.what() << "\n";
        return kBadUsage;
    } catch (const std::exception& error) {
        std::cerr << "modemsim: " << error.what() << "\n";
        return kFailed;
    }
}
