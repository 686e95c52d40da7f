// SPDX-License-Identifier: MIT
#include "daemon/event_watch.h"

#include <glib-unix.h>

#include <utility>

namespace taviwireless::daemon {

namespace {

constexpr guint kSettleTime = 100;  // milliseconds

}  // namespace

EventWatch::EventWatch(int handle, std::function<bool(int handle)> read,
                       std::function<void()> onChange)
    : read_(std::move(read)), onChange_(std::move(onChange)) {
    source_ = g_unix_fd_add(
        handle, G_IO_IN,
        [](gint readable, GIOCondition, gpointer self) -> gboolean {
            static_cast<EventWatch*>(self)->Read(readable);
            return G_SOURCE_CONTINUE;
        },
        this);
}

EventWatch::~EventWatch() {
    g_source_remove(source_);
    if (delay_ != 0) {
        g_source_remove(delay_);
    }
}

void EventWatch::Read(int handle) {
    if (!read_(handle) || delay_ != 0) {
        return;
    }
    delay_ = g_timeout_add(
        kSettleTime,
        [](gpointer data) -> gboolean {
            auto* self = static_cast<EventWatch*>(data);
            self->delay_ = 0;
            self->onChange_();
            return G_SOURCE_REMOVE;
        },
        this);
}

}  // namespace taviwireless::daemon
