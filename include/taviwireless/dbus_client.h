// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DBUS_CLIENT_H
#define TAVIWIRELESS_DBUS_CLIENT_H

#include <dbus/dbus.h>
#include <taviwireless/export.h>

#include <string>
#include <vector>

namespace taviwireless::dbus {

// Calls methods of one object on a message bus, one call at a time: NewMessage, any number of
// Append, SendMessage, and GetReply where a value is expected.
//
// Cheap and short-lived; the bus connection is the one that libdbus shares within the process. A
// connection that died because the bus was restarted is replaced when an object is made. An int
// result is 0 for success and -1 for failure where nothing else is said; a failure is one line in
// the system log. Used by one thread at a time.
class TAVIWIRELESS_API DBusClient {
  public:
    // Connects to the bus of this type; service, path and interface name the object that is called.
    // They are copied, and checked in NewMessage. Without a bus the object stays usable, and every
    // NewMessage fails.
    DBusClient(const char* service, const char* path, const char* interface, DBusBusType type);
    virtual ~DBusClient();
    DBusClient(const DBusClient&) = delete;
    DBusClient& operator=(const DBusClient&) = delete;

    // Begins a call of method; what was built before is dropped. Fails for a null method, and when
    // one of the names is none that D-Bus allows.
    int NewMessage(const char* method);
    // Adds an argument, text or truth value; fails without a call that was begun. Text must be
    // UTF-8, as D-Bus demands, and is never logged, since it may be a PIN or a password.
    int Append(const char* value);
    int Append(bool value);
    // Sends the call that was built; calling it again sends the call once more.
    //
    // With wantReply waits for the answer, timeout milliseconds at most (-1: the default of
    // libdbus, 25 s), and returns 0, or -n for the service's error of code n, or -1 for every other
    // failure. So the service's error -1 gives +1. Compatible with the front ends, which take a
    // result that is not negative for success.
    //
    // Without wantReply returns as soon as the call is handed to the bus; timeout means nothing.
    int SendMessage(bool wantReply, int timeout);
    // Takes the value of the reply, which is then gone: a text, or the texts of an array. Fails,
    // with out as it was, when there is no reply or its first value is of another type.
    int GetReply(std::string& out);
    int GetReply(std::vector<std::string>& out);

  private:
    std::string service_;
    std::string path_;
    std::string interface_;
    DBusBusType busType_;
    DBusConnection* connection_ = nullptr;
    DBusMessage* message_ = nullptr;
    DBusMessage* reply_ = nullptr;
};

}  // namespace taviwireless::dbus

#endif
