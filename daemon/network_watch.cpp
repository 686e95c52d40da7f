// SPDX-License-Identifier: MIT
#include "daemon/network_watch.h"

#include <linux/netlink.h>
#include <linux/rtnetlink.h>
#include <sys/socket.h>

#include <cerrno>
#include <system_error>
#include <utility>

namespace taviwireless::daemon {

namespace {

// That there are messages is enough, also that some were lost (ENOBUFS).
bool TakeMessages(int handle) {
    char buffer[4096];
    while (recv(handle, buffer, sizeof buffer, MSG_TRUNC) > 0 || errno == ENOBUFS ||
           errno == EINTR) {
        errno = 0;
    }
    return true;
}

}  // namespace

NetworkWatch::NetworkWatch(std::function<void()> onChange)
    : handle_(socket(AF_NETLINK, SOCK_RAW | SOCK_NONBLOCK | SOCK_CLOEXEC, NETLINK_ROUTE)) {
    sockaddr_nl changes{};
    changes.nl_family = AF_NETLINK;
    changes.nl_groups = RTMGRP_LINK | RTMGRP_IPV4_IFADDR;
    if (!handle_ ||
        bind(handle_.Get(), reinterpret_cast<sockaddr*>(&changes), sizeof changes) != 0) {
        throw std::system_error(errno, std::generic_category(), "cannot watch the network");
    }
    watch_.emplace(handle_.Get(), TakeMessages, std::move(onChange));
}

}  // namespace taviwireless::daemon
