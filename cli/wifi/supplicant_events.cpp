// SPDX-License-Identifier: MIT
#include "cli/wifi/supplicant_events.h"

#include <poll.h>
#include <sys/socket.h>

#include <system_error>

#include "base/unique_fd.h"
#include "cli/adapter/requirements.h"
#include "wireless/system/supplicant_socket.h"

namespace taviwireless::cli {

namespace {

struct Reason {
    const char* event;
    const char* text;
    int weight;
};
constexpr Reason kReasons[] = {
    {"CTRL-EVENT-NETWORK-NOT-FOUND", "its access point was not found: it may be too far away", 1},
    {"CTRL-EVENT-ASSOC-REJECT", "its access point refused the adapter", 2},
    {"reason=AUTH_FAILED", "its access point refused user or password", 3},
    {"CTRL-EVENT-EAP-FAILURE", "its access point refused user or password", 3},
    {"reason=WRONG_KEY", "its access point refused the key", 3},
};
constexpr char kPing[] = "PING";  // it answers
constexpr char kEnd[] = "CTRL-EVENT-TERMINATING";

}  // namespace

SupplicantEvents::SupplicantEvents() {
    try {
        thread_ = stop_ ? std::thread([this] { Listen(); }) : std::thread();
    } catch (const std::system_error&) {  // then no reason will be known
    }
}

SupplicantEvents::~SupplicantEvents() {
    Stop();
}

std::string SupplicantEvents::WhyNotJoined() {
    Stop();
    return reason_;
}

void SupplicantEvents::Stop() {
    stop_.writeEnd.Close();
    if (thread_.joinable()) {
        thread_.join();
    }
}

void SupplicantEvents::Listen() {
    constexpr int kPause = 20;  // ms
    do {
        if (const UniqueFd handle = wireless::AttachToSupplicant(WifiInterface()); handle) {
            Hear(handle.Get());
        }
    } while (!IsOver(kPause));
}

void SupplicantEvents::Hear(int socket) {
    constexpr int kPatience = 500;  // ms; one that was killed says nothing
    bool isOver = false;
    for (bool hasEnded = false; !isOver && !hasEnded;) {
        isOver = IsOver(kPatience, socket);
        bool isQuiet = true;
        char text[2048];
        for (ssize_t size; (size = recv(socket, text, sizeof text, MSG_DONTWAIT)) > 0;) {
            const std::string event(text, static_cast<size_t>(size));
            Note(event);
            isQuiet = false;
            hasEnded = hasEnded || event.find(kEnd) != std::string::npos;
        }
        hasEnded = hasEnded || (isQuiet && send(socket, kPing, sizeof kPing - 1, MSG_DONTWAIT) < 0);
    }
}

// Waits that long, or until there is something to read from the socket.
bool SupplicantEvents::IsOver(int milliseconds, int socket) const {
    pollfd ends[] = {{stop_.readEnd.Get(), POLLIN, 0}, {socket, POLLIN, 0}};
    poll(ends, 2, milliseconds);
    return ends[0].revents != 0;
}

void SupplicantEvents::Note(const std::string& event) {
    for (const Reason& known : kReasons) {
        if (known.weight > weight_ && event.find(known.event) != std::string::npos) {
            weight_ = known.weight;
            reason_ = known.text;
        }
    }
}

}  // namespace taviwireless::cli
