// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DBUS_SERVER_H
#define TAVIWIRELESS_DBUS_SERVER_H

#include <dbus/dbus-glib.h>
#include <dbus/dbus.h>
#include <taviwireless/export.h>

#include <string>

namespace taviwireless::dbus {

// One object on a message bus under a well-known name, and the GLib main loop that serves it.
//
// Make it, initialize it once, then StartLoop; calls are dispatched one at a time on the thread
// that runs the loop. The bus connection is the one that dbus-glib shares within the process.
class TAVIWIRELESS_API DBusServer {
  public:
    // Connects to the bus of this type. busName: the well-known name to ask for. path: where the
    // object is exported. Both are copied. A bus that cannot be reached shows in initialize.
    DBusServer(const char* busName, const char* path, DBusBusType type);
    virtual ~DBusServer();
    DBusServer(const DBusServer&) = delete;
    DBusServer& operator=(const DBusServer&) = delete;

    // Describes the type to D-Bus, asks the bus for the name and exports the object at the path.
    //
    // type: the GObject type that info describes.
    // info: what dbus-binding-tool generated for it. Borrowed for the life of the process.
    // object: an instance of type. Borrowed; it is no longer exported once it is finalized.
    //
    // Returns false, with a line in the log, when the bus cannot be asked. A name that somebody
    // else owns is no failure here: the request is then queued.
    bool initialize(GType type, const DBusGObjectInfo* info, GObject* object);

    // Serves on the calling thread until QuitLoop. Returns at once when the loop runs already. When
    // the bus ends, libdbus ends the process with status 1.
    void StartLoop();
    // Ends the loop after the call that is being served; StartLoop then returns and may be called
    // again. Does nothing when none runs.
    void QuitLoop();

    // These describe the proxy of the bus itself ("org.freedesktop.DBus"), not the service. The
    // texts belong to the proxy; null without a bus.
    const char* GetInterface() const;
    const char* GetPath() const;
    const char* GetBusName() const;
    // The connection's unique name, such as ":1.7"; null without a bus.
    const char* GetConnectionName() const;

  private:
    GMainLoop* loop_ = nullptr;
    DBusGProxy* proxy_ = nullptr;
    DBusGConnection* connection_ = nullptr;
    DBusBusType busType_;
    std::string busName_;
    std::string path_;
};

}  // namespace taviwireless::dbus

#endif
