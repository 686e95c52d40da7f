// SPDX-License-Identifier: MIT
#include "cli/ap/failure_reason.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <iostream>
#include <vector>

#include "base/memory_file.h"
#include "base/split.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

bool BeginsWith(const std::string& text, const std::string& beginning) {
    return text.rfind(beginning, 0) == 0;
}

// What hostapd says of every start, or once the reason was said.
bool IsNoReason(const std::string& line) {
    constexpr const char* kNoise[] = {"Configuration file:", "Using interface", "nl80211: deinit",
                                      "hostapd_free", "rc.network: "};
    const bool isState = line.find(": interface state ") != line.npos ||
                         line.find(": AP-DISABLED") != line.npos ||
                         line.find(": CTRL-EVENT-TERMINATING") != line.npos;
    return line.empty() || isState ||
           std::any_of(std::begin(kNoise), std::end(kNoise),
                       [&](auto noise) { return BeginsWith(line, noise); });
}

}  // namespace

ErrorKeeper::ErrorKeeper()
    : kept_(MemoryFile()), before_(fcntl(STDERR_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1)) {
    if (kept_ && before_) {
        fcntl(kept_.Get(), F_SETFL, O_APPEND);
        dup2(kept_.Get(), STDERR_FILENO);
    }
}

ErrorKeeper::~ErrorKeeper() {
    if (kept_ && before_) {
        dup2(before_.Get(), STDERR_FILENO);
        std::cerr << Text();
    }
}

std::string ErrorKeeper::Text() const {
    return kept_ ? TextOf(kept_) : "";
}

std::string ReasonIn(const std::string& errors) {
    constexpr char kProgram[] = "rc.network: ";
    std::vector<std::string> lines = Lines(errors);
    // The library's own log, with --verbose.
    lines.erase(std::remove_if(lines.begin(), lines.end(),
                               [](const auto& line) { return BeginsWith(line, "taviwireless: "); }),
                lines.end());
    const auto last =
        std::find_if(lines.rbegin(), lines.rend(), [](const auto& line) { return !line.empty(); });
    if (last == lines.rend()) {
        return "";
    }
    std::string reason = *last;
    reason.erase(0, BeginsWith(reason, kProgram) ? sizeof kProgram - 1 : 0);
    const size_t above = reason.find("; its messages above say why");
    const auto said = std::find_if_not(lines.begin(), lines.end(), IsNoReason);
    if (above != reason.npos && said != lines.end()) {
        reason = reason.substr(0, above) + ": " + *said;
    }
    return Printable(reason);
}

}  // namespace taviwireless::cli
