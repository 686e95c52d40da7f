// SPDX-License-Identifier: MIT
#include "daemon/folder_watch.h"

#include <sys/inotify.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <system_error>
#include <utility>

namespace taviwireless::daemon {

namespace {

constexpr uint32_t kChanges = IN_CLOSE_WRITE | IN_MOVED_TO | IN_MOVED_FROM | IN_DELETE;

}  // namespace

FolderWatch::FolderWatch(std::string folder, std::vector<std::string> names, bool eachWriting,
                         std::function<void()> onChange)
    : folder_(std::move(folder)),
      names_(std::move(names)),
      eachWriting_(eachWriting),
      handle_(inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
    if (!handle_) {
        throw std::system_error(errno, std::generic_category(), "cannot watch " + folder_);
    }
    watch_.emplace(
        handle_.Get(), [this](int handle) { return ReadEvents(handle); }, std::move(onChange));
}

bool FolderWatch::Begin() {
    return inotify_add_watch(handle_.Get(), folder_.c_str(),
                             kChanges | (eachWriting_ ? IN_MODIFY : 0)) >= 0;
}

bool FolderWatch::ReadEvents(int handle) const {
    alignas(inotify_event) char buffer[4096];
    bool hasChanged = false;
    // Events that were lost may have been about anything.
    const auto concerns = [this](const inotify_event& event) {
        const std::string name = event.len > 0 ? event.name : "";
        return (event.mask & IN_Q_OVERFLOW) != 0 ||
               std::any_of(names_.begin(), names_.end(),
                           [&](const std::string& begin) { return name.rfind(begin, 0) == 0; });
    };
    for (ssize_t size; (size = read(handle, buffer, sizeof buffer)) > 0;) {
        for (const char* next = buffer; next < buffer + size;) {
            const auto& event = *static_cast<const inotify_event*>(static_cast<const void*>(next));
            hasChanged = hasChanged || concerns(event);
            next += sizeof event + event.len;
        }
    }
    return hasChanged;
}

}  // namespace taviwireless::daemon
