// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_SESSION_BUS_H
#define TAVIWIRELESS_DAEMON_SESSION_BUS_H

#include <dbus/dbus.h>

#include <chrono>
#include <functional>
#include <string>

namespace taviwireless::daemon {

// The session bus as the daemon sees it: reached or not, lost, and who owns a name on it. It is the
// connection that the service uses as well.
class SessionBus {
  public:
    // Throws std::runtime_error when there is no bus. The first function is called after each call
    // of a method was served, the second when the bus goes away. A call that had to wait behind
    // others and whose caller has left meanwhile is dropped unserved.
    SessionBus(std::function<void()> onServed, std::function<void()> onLost);
    ~SessionBus();
    SessionBus(const SessionBus&) = delete;
    SessionBus& operator=(const SessionBus&) = delete;

    // The unique name of the owner; empty when there is none.
    std::string OwnerOf(const char* name) const;

    bool IsLost() const;

  private:
    using Clock = std::chrono::steady_clock;

    static DBusHandlerResult Look(DBusConnection* connection, DBusMessage* message, void* self);
    bool HasLeft(const char* caller);
    void Serve();

    std::function<void()> onServed_;
    std::function<void()> onLost_;
    DBusConnection* connection_;
    unsigned int served_ = 0;  // GLib source, while one is waiting
    unsigned int idle_ = 0;    // GLib source; while there is one, calls have been waiting
    Clock::time_point began_;  // when the last call that was served came
    std::string gone_;         // the last caller that had left; names are never used again
};

}  // namespace taviwireless::daemon

#endif
