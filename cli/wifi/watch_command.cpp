// SPDX-License-Identifier: MIT
// taviwireless wifi watch: the connection and its signal as they change.
#include <linux/netlink.h>
#include <linux/rtnetlink.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <csignal>
#include <deque>
#include <iostream>

#include "base/unique_fd.h"
#include "cli/adapter/requirements.h"
#include "cli/command_error.h"
#include "cli/level.h"
#include "cli/terminal.h"
#include "cli/text_width.h"
#include "cli/wifi/station.h"
#include "cli/wifi/wifi_commands.h"
#include "cli/wifi/wifi_report.h"

namespace taviwireless::cli {

namespace {

constexpr int kInterval = 2000;  // ms between two looks at the signal

// Ends the program wherever it is: everything shown is written out.
void EndWithSuccess(int) {
    _exit(kSuccess);
}
void EndLineWithSuccess(int) {
    [[maybe_unused]] const ssize_t count = write(STDOUT_FILENO, "\n", 1);
    _exit(kSuccess);
}

// Tells of interfaces that come, go, and get another address.
class LinkEvents {
  public:
    LinkEvents() : socket_(socket(AF_NETLINK, SOCK_RAW | SOCK_CLOEXEC, NETLINK_ROUTE)) {
        sockaddr_nl address{};
        address.nl_family = AF_NETLINK;
        address.nl_groups = RTMGRP_LINK | RTMGRP_IPV4_IFADDR;
        if (bind(socket_.Get(), reinterpret_cast<sockaddr*>(&address), sizeof address) != 0) {
            socket_.Close();  // what changes shows at the next interval
        }
    }

    void Wait() const {
        pollfd event{socket_.Get(), POLLIN, 0};
        poll(&event, 1, kInterval);
        char ignored[8192];
        while (socket_ && recv(socket_.Get(), ignored, sizeof ignored, MSG_DONTWAIT) > 0) {
        }
    }

  private:
    UniqueFd socket_;
};

// What is shown of the connection: a sentence, and the signal over time.
class Watch {
  public:
    explicit Watch(const Options& options)
        : options_(options), isInPlace_(!options.json && TakesEscapes(STDOUT_FILENO)) {}

    bool IsInPlace() const { return isInPlace_; }

    void LookAgain() {
        const WirelessStatus status = LookAtWifi();
        const std::string line = ConnectionLine(status, WifiAddress());
        if (line != line_) {
            signals_.clear();
        }
        signals_.push_back(IsInNetwork(status.status) ? status.network.signal : 0);
        if (options_.json) {
            constexpr bool kInOneLine = true;
            Show(Render(options_, DescribeConnection(), kInOneLine));
        } else {
            const std::string percent =
                signals_.back() == 0 ? "" : "  " + std::to_string(signals_.back()) + "%";
            Show(isInPlace_ ? InPlace(line, percent) : line + percent + "\n");
        }
        line_ = line;
    }

  private:
    // The line in the place of the one before, or below it when something else is to be said.
    std::string InPlace(const std::string& line, const std::string& percent) {
        constexpr char kClearLine[] = "\r\033[K";
        constexpr size_t kMost = 60;
        const auto width = static_cast<size_t>(std::max(TerminalWidth() - 1, 10));
        const size_t least = percent.empty() ? 0 : width / 4;  // of the history
        const std::string now = Cut(line, width - percent.size() - least) + percent;
        const size_t room =
            std::min(std::max(width - std::min(TextWidth(now), width), least), kMost);
        while (signals_.size() + 2 > std::max<size_t>(room, 3)) {
            signals_.pop_front();
        }
        std::string history;
        for (const int signal : signals_) {
            history += Level(signal);
        }
        const bool isNew = !line_.empty() && line != line_;
        return (isNew ? "\n" : kClearLine) + now +
               (percent.empty() || room < 3 ? "" : "  " + history);
    }

    void Show(const std::string& text) {
        if (text != shown_) {
            std::cout << text;
            FlushOutput();
        }
        shown_ = text;
    }

    const Options& options_;
    const bool isInPlace_;
    std::deque<int> signals_;  // percent; the last is that of now
    std::string line_;
    std::string shown_;
};

}  // namespace

void WatchWifi(const Options& options) {
    RequireWifiSupport();
    Watch watch(options);
    for (const int number : {SIGINT, SIGTERM}) {
        signal(number, watch.IsInPlace() ? EndLineWithSuccess : EndWithSuccess);
    }
    const LinkEvents events;
    for (;;) {
        watch.LookAgain();
        events.Wait();
    }
}

}  // namespace taviwireless::cli
