// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_MODEM_OBJECTS_H
#define TAVIWIRELESS_DAEMON_MODEM_OBJECTS_H

#include <dbus/dbus.h>
#include <glib.h>

#include <atomic>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "daemon/modem_state.h"
#include "daemon/property.h"

namespace taviwireless::daemon {

// The objects of modem_objects.xml, on a bus connection and a thread of their own: so they answer
// while the main loop waits for a modem. The two threads share what the objects show.
class ModemObjects {
  public:
    // Ends a call of Look or Command: with an empty name it succeeded, and the text is what Command
    // returns; any other is that of an error behind "com.merilond.usbmodem.Error.", with a sentence.
    using Reply = std::function<void(const std::string& error, const std::string& text)>;
    // Get calls of Look and Command, in the main loop.
    using OnLook = std::function<void(const std::string& id, const Reply& reply)>;
    using OnCommand =
        std::function<void(const std::string& id, const std::string& command, const Reply& reply)>;

    // Takes the name, at the latest when nobody else has it. Throws std::runtime_error when there is
    // no bus, or when its rules refuse the name.
    ModemObjects(OnLook onLook, OnCommand onCommand);
    ~ModemObjects();
    ModemObjects(const ModemObjects&) = delete;
    ModemObjects& operator=(const ModemObjects&) = delete;

    // Makes the objects what these modems are. What did not change is not sent.
    void Publish(const std::vector<ModemState>& modems);

    // Whether somebody who has called the objects is still on the bus.
    bool HasClients() const { return hasClients_; }

  private:
    struct Method;
    using Message = std::shared_ptr<DBusMessage>;

    static const Method* FindMethod(const Message& call);
    static DBusHandlerResult Handle(DBusConnection* connection, DBusMessage* call, void* self);
    static DBusHandlerResult NoteCaller(DBusConnection* connection, DBusMessage* message,
                                        void* self);
    void Serve(const Message& call);
    void Introspect(const Message& call);
    void Get(const Message& call);
    void GetAll(const Message& call);
    void Set(const Message& call);
    void GetManagedObjects(const Message& call);
    void Look(const Message& call);
    void Command(const Message& call);
    const Properties* PropertiesFor(const Message& call, const std::string& interface) const;
    const Property* FindProperty(const Message& call) const;
    void TellChanges(const std::string& id, const Properties& before, const Properties& now) const;
    void TellAdded(const std::string& id, const Properties& properties) const;
    void TellRemoved(const std::string& id) const;
    Reply ReplyTo(const Message& call) const;
    void Refuse(const Message& call, const std::string& error, const std::string& sentence) const;
    void Answer(const Message& call, const Message& reply) const;
    void Send(const Message& message) const;
    void AddClient(const std::string& name);
    void DropClient(const std::string& name);

    OnLook onLook_;
    OnCommand onCommand_;
    std::atomic<bool> hasClients_{false};
    std::unique_ptr<GMainContext, void (*)(GMainContext*)> context_;
    std::unique_ptr<GMainLoop, void (*)(GMainLoop*)> loop_;
    std::unique_ptr<DBusConnection, void (*)(DBusConnection*)> connection_;
    std::mutex mutex_;                          // of what follows, and of the order of signals
    std::map<std::string, Properties> modems_;  // by device id
    std::set<std::string> clients_;             // unique names; of the thread alone
    std::thread thread_;
};

}  // namespace taviwireless::daemon

#endif
