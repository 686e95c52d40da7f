#ifndef TAVIWIRELESS_DAEMON_INFO_FILE_WATCH_H
#define TAVIWIRELESS_DAEMON_INFO_FILE_WATCH_H

#include <glib.h>

#include <functional>

#include "base/unique_fd.h"

namespace taviwireless::daemon {

// Calls back from the main loop when an info file of a modem in "/tmp/" came, went or was written.
// Changes that follow each other closely, such as the lines of one file, make one call.
class InfoFileWatch {
  public:
    // Throws std::system_error when the folder cannot be watched.
    explicit InfoFileWatch(std::function<void()> onChange);
    ~InfoFileWatch();
    InfoFileWatch(const InfoFileWatch&) = delete;
    InfoFileWatch& operator=(const InfoFileWatch&) = delete;

  private:
    bool ReadEvents();

    std::function<void()> onChange_;
    UniqueFd handle_;
    guint source_ = 0;
    guint delay_ = 0;
};

}  // namespace taviwireless::daemon

#endif
