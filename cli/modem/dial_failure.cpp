// SPDX-License-Identifier: MIT
#include "cli/modem/dial_failure.h"

#include <tavisdk/network.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <fstream>
#include <sstream>

#include "cli/terminal.h"
#include "usbmodem/rules/dial_log.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::cli {

namespace {

constexpr char kPeer[] = "/etc/ppp/peers/wvdial";  // dialling changes it

std::optional<struct stat> StatusOf(const std::string& path) {
    struct stat status {};
    return stat(path.c_str(), &status) == 0 ? std::optional(status) : std::nullopt;
}

bool IsSame(const struct stat& a, const struct stat& b) {
    return a.st_ino == b.st_ino && a.st_ctim.tv_sec == b.st_ctim.tv_sec &&
           a.st_ctim.tv_nsec == b.st_ctim.tv_nsec;
}

// What the library checks before it starts the dialler; empty when none of it is the reason.
std::string WhyNotStarted(bool takesDefaultRoute) {
    for (const char* path : {kPeer, usbmodem_lib::kStateDirectory}) {
        if (access(path, R_OK | W_OK) != 0) {
            return std::string("cannot change ") + path + ": " + strerror(errno) +
                   (errno == EACCES ? " (dialling needs root)" : "");
        }
    }
    char gateway[TAVI_NET_ADDRESS_SIZE] = {};
    if (takesDefaultRoute && TAVINetDefaultGatewayGet(gateway, sizeof gateway) != 0) {
        return "there is no default route that it could give back later; set one, or "
               "default-route=no in its profile";
    }
    return "";
}

}  // namespace

DialAttempt::DialAttempt(ModemAccess& access, const ModemState& state)
    : id_(state.id), log_(access.LogFile(state)), before_(StatusOf(log_)) {
    const auto route = state.profile.find(profile::kDefaultGateway);
    takesDefaultRoute_ = route != state.profile.end() && route->second == "true";
}

// The log is made anew for each attempt that comes so far.
CommandError DialAttempt::Failure() const {
    const auto now = StatusOf(log_);
    const bool wasStarted = now && (!before_ || !IsSame(*before_, *now));
    std::ifstream file(log_);
    std::ostringstream text;
    text << file.rdbuf();
    const std::string reason = wasStarted ? usbmodem_lib::dial_log::ReasonIn(text.str())
                                          : WhyNotStarted(takesDefaultRoute_);
    if (!reason.empty()) {
        return {kFailure, id_ + " is not connected: " + Printable(reason)};
    }
    return {kFailure, wasStarted ? "the dialler of " + id_ + " gave up; its log, " + log_ +
                                       ", does not tell why"
                                 : "the dialler of " + id_ +
                                       " gave up, or could not be started; the system log "
                                       "tells why"};
}

}  // namespace taviwireless::cli
