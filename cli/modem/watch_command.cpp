// SPDX-License-Identifier: MIT
// taviwireless modem watch: the states of the modems as they change.
#include <signal.h>
#include <unistd.h>

#include <iostream>
#include <map>

#include "cli/command_error.h"
#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"
#include "cli/modem/sparkline.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

// Ends the program wherever it is: a look may take long, and everything shown is written out.
void EndWithSuccess(int) {
    _exit(kSuccess);
}

// What is shown, with the signals as they were at the changes before.
class Watched {
  public:
    Watched(ModemAccess& access, const Options& options) : access_(access), options_(options) {}

    Report LookAgain() {
        if (!options_.id.empty()) {
            ModemState state = access_.Known(options_.id);
            AddTrend(state);
            return Describe(state);
        }
        std::vector<ModemState> states = access_.KnownModems(options_.json);
        for (ModemState& state : states) {
            AddTrend(state);
        }
        return DescribeAll(states);
    }

  private:
    // A value that comes again is no news.
    void AddTrend(ModemState& state) {
        Signal& signal = signals_[state.id];
        if (signal.last != state.signal && state.simStatus == kReady) {
            signal.last = state.signal;
            signal.trend.Add(state.signal);
        }
        state.trend = signal.trend.Draw();
    }

    struct Signal {
        int last = -1;  // percent
        Trend trend;
    };
    ModemAccess& access_;
    const Options& options_;
    std::map<std::string, Signal> signals_;
};

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
    Watched watched(*access, options);
    std::string shown;
    for (;;) {
        deadline.Restart();
        const Report report = deadline.Limit([&] { return watched.LookAgain(); });
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
