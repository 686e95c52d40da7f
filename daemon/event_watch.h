// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_EVENT_WATCH_H
#define TAVIWIRELESS_DAEMON_EVENT_WATCH_H

#include <glib.h>

#include <functional>

namespace taviwireless::daemon {

// Calls back from the main loop when a descriptor has told of something. What follows closely, such
// as the lines of one file, makes one call, a tenth of a second after the first.
class EventWatch {
  public:
    // read takes all that can be read from the handle, and returns whether it matters. The handle
    // is borrowed.
    EventWatch(int handle, std::function<bool(int handle)> read, std::function<void()> onChange);
    ~EventWatch();
    EventWatch(const EventWatch&) = delete;
    EventWatch& operator=(const EventWatch&) = delete;

  private:
    void Read(int handle);

    std::function<bool(int handle)> read_;
    std::function<void()> onChange_;
    guint source_;
    guint delay_ = 0;
};

}  // namespace taviwireless::daemon

#endif
