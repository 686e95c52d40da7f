// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_BUS_H
#define TAVIWIRELESS_CLI_MODEM_BUS_H

#include <dbus/dbus.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace taviwireless::cli {

// The session bus by libdbus, which the library uses as well: GIO would bring five more libraries
// and a thread, and ends the program where none can be had.

struct BusFailure {
    BusFailure() { dbus_error_init(&error); }
    ~BusFailure() { dbus_error_free(&error); }
    BusFailure(const BusFailure&) = delete;
    BusFailure& operator=(const BusFailure&) = delete;

    bool Is(const char* name) const { return dbus_error_has_name(&error, name) != FALSE; }
    std::string Text() const;  // printable

    DBusError error;
};

struct CloseBus {
    void operator()(DBusConnection* connection) const {
        dbus_connection_close(connection);
        dbus_connection_unref(connection);
    }
};
using Bus = std::unique_ptr<DBusConnection, CloseBus>;

// A connection of its own, so that nothing waits behind the calls of others. Null on failure.
Bus ConnectToBus(BusFailure& failure);

struct FreeMessage {
    void operator()(DBusMessage* message) const { dbus_message_unref(message); }
};
using Message = std::unique_ptr<DBusMessage, FreeMessage>;

// A call with these texts as arguments. libdbus ends the program for a path or a text that the bus
// does not take: a modem's id and text that is printable are taken.
Message NewCall(const std::string& service, const std::string& path, const std::string& interface,
                const char* method, const std::vector<std::string>& arguments = {});

// The reply, if it has this signature; else null.
Message Ask(DBusConnection* bus, const Message& call, const char* signature, BusFailure& failure,
            int timeout = DBUS_TIMEOUT_USE_DEFAULT);

// What a reply holds first.
DBusMessageIter Content(const Message& reply);

// Calls `see` with each entry of a dictionary, or with each text of what should be a list of them.
using SeeEntry = std::function<void(const char* key, DBusMessageIter value)>;
using SeeText = std::function<void(const char* text)>;
void ForEachEntry(DBusMessageIter dictionary, const SeeEntry& see);
void ForEachText(DBusMessageIter list, const SeeText& see);

}  // namespace taviwireless::cli

#endif
