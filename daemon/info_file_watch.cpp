#include "daemon/info_file_watch.h"

#include <glib-unix.h>
#include <sys/inotify.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <system_error>
#include <utility>

#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

namespace {

using usbmodem_lib::kInfoDirectory;
using usbmodem_lib::kInfoName;

constexpr uint32_t kChanges = IN_CLOSE_WRITE | IN_MOVED_TO | IN_MOVED_FROM | IN_DELETE;
constexpr guint kSettleTime = 100;  // milliseconds

// Events that were lost may have been about anything.
bool Concerns(const inotify_event& event) {
    return (event.mask & IN_Q_OVERFLOW) != 0 ||
           (event.len > 0 && strncmp(event.name, kInfoName, sizeof kInfoName - 1) == 0);
}

}  // namespace

InfoFileWatch::InfoFileWatch(std::function<void()> onChange)
    : onChange_(std::move(onChange)), handle_(inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
    if (!handle_ || inotify_add_watch(handle_.Get(), kInfoDirectory, kChanges) < 0) {
        throw std::system_error(errno, std::generic_category(), "cannot watch /tmp/");
    }
    source_ = g_unix_fd_add(
        handle_.Get(), G_IO_IN,
        [](gint, GIOCondition, gpointer self) -> gboolean {
            return static_cast<InfoFileWatch*>(self)->ReadEvents();
        },
        this);
}

InfoFileWatch::~InfoFileWatch() {
    g_source_remove(source_);
    if (delay_ != 0) {
        g_source_remove(delay_);
    }
}

bool InfoFileWatch::ReadEvents() {
    alignas(inotify_event) char buffer[4096];
    bool hasChanged = false;
    for (ssize_t size; (size = read(handle_.Get(), buffer, sizeof buffer)) > 0;) {
        for (const char* next = buffer; next < buffer + size;) {
            const auto& event = *static_cast<const inotify_event*>(static_cast<const void*>(next));
            hasChanged = hasChanged || Concerns(event);
            next += sizeof event + event.len;
        }
    }
    if (hasChanged && delay_ == 0) {
        delay_ = g_timeout_add(
            kSettleTime,
            [](gpointer data) -> gboolean {
                auto* self = static_cast<InfoFileWatch*>(data);
                self->delay_ = 0;
                self->onChange_();
                return G_SOURCE_REMOVE;
            },
            this);
    }
    return G_SOURCE_CONTINUE;
}

}  // namespace taviwireless::daemon
