// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_MODEM_OBJECTS_H
#define TAVIWIRELESS_DAEMON_MODEM_OBJECTS_H

#include <gio/gio.h>
#include <taviwireless/usbmodem.h>

#include <atomic>
#include <cstdint>
#include <ctime>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <thread>
#include <vector>

namespace taviwireless::daemon {

// What the object of a modem shows.
struct ModemState {
    std::string id;
    bool answers = false;
    usbmodem_lib::KnownModem known;
    time_t lastLook = 0;  // 0: never
    time_t dialledAt = 0;
    std::uint64_t bytesSent = 0;
    std::uint64_t bytesReceived = 0;
};

// All that can be told of a modem without asking it.
ModemState StateOf(const usbmodem_lib::USBModem& modem, time_t lastLook);

// The objects of modem_objects.xml, on a bus connection and a thread of their own: so they answer
// while the main loop waits for a modem. The two threads share nothing but the work that one leaves
// for the other.
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
    void Publish(std::vector<ModemState> modems);

    // Whether somebody who has called the objects is still on the bus.
    bool HasClients() const { return hasClients_; }

  private:
    static gboolean HandleLook(GDBusInterfaceSkeleton* modem, GDBusMethodInvocation* call,
                               gpointer self);
    static gboolean HandleCommand(GDBusInterfaceSkeleton* modem, GDBusMethodInvocation* call,
                                  const char* command, gpointer self);
    static GDBusMessage* NoteCaller(GDBusConnection* connection, GDBusMessage* message,
                                    gboolean isIncoming, gpointer self);
    void Run();
    void Show(const std::vector<ModemState>& modems);
    void Export(const std::string& id, GDBusInterfaceSkeleton* modem);
    void AddClient(const std::string& name);
    void DropClient(const std::string& name);

    template <typename Object, typename Deleter = void (*)(gpointer)>
    using Owned = std::unique_ptr<Object, Deleter>;

    OnLook onLook_;
    OnCommand onCommand_;
    std::atomic<bool> hasClients_{false};
    Owned<GDBusConnection> connection_{nullptr, g_object_unref};
    guint filter_ = 0;
    Owned<GMainContext, void (*)(GMainContext*)> context_;
    Owned<GMainLoop, void (*)(GMainLoop*)> loop_;
    // These belong to the thread.
    Owned<GDBusObjectManagerServer> manager_{nullptr, g_object_unref};
    std::map<std::string, Owned<GDBusInterfaceSkeleton>> modems_;
    std::map<std::string, guint> clients_;  // unique names, and what watches for their end
    std::thread thread_;
};

}  // namespace taviwireless::daemon

#endif
