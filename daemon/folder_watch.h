// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_FOLDER_WATCH_H
#define TAVIWIRELESS_DAEMON_FOLDER_WATCH_H

#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "base/unique_fd.h"
#include "daemon/event_watch.h"

namespace taviwireless::daemon {

// Calls back from the main loop when a file of a folder whose name begins so came, went, or was
// closed by one who could write to it; with eachWriting also at every writing.
class FolderWatch {
  public:
    // Throws std::system_error when nothing can be watched at all.
    FolderWatch(std::string folder, std::vector<std::string> names, bool eachWriting,
                std::function<void()> onChange);

    // Watches the folder that has this path now; false, with errno set, when there is none. Costs
    // nothing when it is watched already.
    bool Begin();

  private:
    bool ReadEvents(int handle) const;

    std::string folder_;
    std::vector<std::string> names_;
    bool eachWriting_;
    UniqueFd handle_;
    std::optional<EventWatch> watch_;
};

}  // namespace taviwireless::daemon

#endif
