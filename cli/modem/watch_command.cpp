// taviwireless modem watch: the states of the modems as they change.
#include <signal.h>
#include <unistd.h>

#include <iostream>

#include "cli/command_error.h"
#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

// Ends the program wherever it is: a look may take long, and everything shown is written out.
void EndWithSuccess(int) {
    _exit(kSuccess);
}

Report LookAgain(ModemAccess& access, const Options& options) {
    return options.id.empty() ? DescribeAll(access.KnownModems(options.json))
                              : Describe(access.Known(options.id));
}

void Show(const std::string& text, bool inPlace) {
    constexpr char kClearScreen[] = "\033[H\033[2J";
    ShowProgress("");
    std::cout << (inPlace ? kClearScreen : "") << text;
    FlushOutput();
}

}  // namespace

void WatchModems(const Options& options) {
    signal(SIGINT, EndWithSuccess);
    signal(SIGTERM, EndWithSuccess);
    const bool inPlace = !options.json && TakesEscapes(STDOUT_FILENO);
    const auto access = MakeAccess(options);
    Deadline deadline(options);
    constexpr bool kInOneLine = true;
    std::string shown;
    for (;;) {
        deadline.Restart();
        const Report report = deadline.Limit([&] { return LookAgain(*access, options); });
        const std::string text = Render(options, report, kInOneLine);
        if (text != shown) {
            const bool isNextTable = !options.json && !inPlace && !shown.empty();
            Show(isNextTable ? "\n" + text : text, inPlace);
            shown = text;
        }
        ShowProgress("");
        access->WaitForChange();
    }
}

}  // namespace taviwireless::cli
