// SPDX-License-Identifier: MIT
#include "daemon/watchdog.h"

#include <glib.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <syslog.h>

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstdlib>
#include <cstring>

#include "base/unique_fd.h"

// Written here, because libsystemd would be one more library for a single datagram.
namespace taviwireless::daemon {

namespace {

gboolean Feed(gpointer /*data*/) {
    sockaddr_un manager{};
    manager.sun_family = AF_UNIX;
    const char* path = getenv("NOTIFY_SOCKET");
    const size_t length = path != nullptr ? strlen(path) : 0;
    if (length == 0 || length > sizeof manager.sun_path) {
        return G_SOURCE_REMOVE;
    }
    memcpy(manager.sun_path, path, length);
    if (manager.sun_path[0] == '@') {
        manager.sun_path[0] = '\0';  // a name that is no file's
    }
    const UniqueFd link(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    constexpr char kAlive[] = "WATCHDOG=1";
    if (sendto(link.Get(), kAlive, sizeof kAlive - 1, MSG_NOSIGNAL,
               reinterpret_cast<sockaddr*>(&manager),
               static_cast<socklen_t>(offsetof(sockaddr_un, sun_path) + length)) < 0) {
        syslog(LOG_WARNING, "cannot reach the service manager's watchdog: %s", strerror(errno));
    }
    return G_SOURCE_CONTINUE;
}

}  // namespace

void FeedWatchdog() {
    const char* microseconds = getenv("WATCHDOG_USEC");
    const long limit = microseconds != nullptr ? atol(microseconds) : 0;
    if (limit > 0) {
        Feed(nullptr);
        g_timeout_add(static_cast<guint>(std::max(limit / 2000, 1L)), Feed, nullptr);
    }
}

}  // namespace taviwireless::daemon
