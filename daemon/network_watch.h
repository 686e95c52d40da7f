// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_NETWORK_WATCH_H
#define TAVIWIRELESS_DAEMON_NETWORK_WATCH_H

#include <functional>
#include <optional>

#include "base/unique_fd.h"
#include "daemon/event_watch.h"

namespace taviwireless::daemon {

// Calls back from the main loop when an interface or an IPv4 address came, went or changed.
class NetworkWatch {
  public:
    // Throws std::system_error when the kernel does not tell.
    explicit NetworkWatch(std::function<void()> onChange);

  private:
    UniqueFd handle_;
    std::optional<EventWatch> watch_;
};

}  // namespace taviwireless::daemon

#endif
