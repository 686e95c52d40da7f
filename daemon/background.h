// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_BACKGROUND_H
#define TAVIWIRELESS_DAEMON_BACKGROUND_H

#include "base/unique_fd.h"

namespace taviwireless::daemon {

// Goes on in the background, while the process that was started waits: it ends with status 0 at
// Ready, or with the status of the one in the background if that ends before. So whoever starts the
// program learns whether it works.
class Background {
  public:
    // Returns in the background process. Throws std::system_error.
    Background();
    // Gives up the terminal and lets the waiting process end.
    void Ready();

  private:
    UniqueFd ready_;
};

}  // namespace taviwireless::daemon

#endif
