// SPDX-License-Identifier: MIT
#include "daemon/session_bus.h"

#include <glib.h>
#include <syslog.h>
#include <taviwireless/dbus_client.h>

#include <stdexcept>
#include <utility>

namespace taviwireless::daemon {

namespace {

constexpr auto kShortWait = std::chrono::milliseconds(50);

}  // namespace

SessionBus::SessionBus(std::function<void()> onServed, std::function<void()> onLost)
    : onServed_(std::move(onServed)), onLost_(std::move(onLost)) {
    DBusError error;
    dbus_error_init(&error);
    connection_ = dbus_bus_get(DBUS_BUS_SESSION, &error);
    if (connection_ == nullptr) {
        const std::string reason = error.message;
        dbus_error_free(&error);
        throw std::runtime_error("cannot reach the session bus (" + reason +
                                 "); start one with dbus-run-session, or set "
                                 "DBUS_SESSION_BUS_ADDRESS to the address of yours");
    }
    dbus_connection_set_exit_on_disconnect(connection_, FALSE);
    dbus_connection_add_filter(connection_, Look, this, nullptr);
}

SessionBus::~SessionBus() {
    for (const unsigned int source : {served_, idle_}) {
        if (source != 0) {
            g_source_remove(source);
        }
    }
    dbus_connection_remove_filter(connection_, Look, this);
    dbus_connection_flush(connection_);  // the reply to a call that was served last
    dbus_connection_unref(connection_);
}

std::string SessionBus::OwnerOf(const char* name) const {
    dbus::DBusClient bus(DBUS_SERVICE_DBUS, DBUS_PATH_DBUS, DBUS_INTERFACE_DBUS, DBUS_BUS_SESSION);
    constexpr int kDefaultTimeout = -1;
    std::string owner;
    if (bus.NewMessage("GetNameOwner") == 0 && bus.Append(name) == 0 &&
        bus.SendMessage(true, kDefaultTimeout) == 0) {
        bus.GetReply(owner);
    }
    return owner;
}

bool SessionBus::IsLost() const {
    return dbus_connection_get_is_connected(connection_) == FALSE;
}

// Whether the caller has left the bus. The bus itself is asked, since its signal about the caller
// still waits behind the calls.
bool SessionBus::HasLeft(const char* caller) {
    if (caller == gone_) {
        return true;
    }
    if (!OwnerOf(caller).empty()) {
        return false;
    }
    syslog(LOG_INFO, "the calls of %s are dropped: it has left the bus", caller);
    gone_ = caller;
    return true;
}

// Makes two sources: served_ calls back before the next call, since calls may never stop; idle_
// goes away once no call is waiting.
void SessionBus::Serve() {
    if (served_ == 0) {
        served_ = g_idle_add_full(
            G_PRIORITY_HIGH,
            [](gpointer self) -> gboolean {
                static_cast<SessionBus*>(self)->served_ = 0;
                static_cast<SessionBus*>(self)->onServed_();
                return G_SOURCE_REMOVE;
            },
            this, nullptr);
    }
    if (idle_ == 0) {
        idle_ = g_idle_add(
            [](gpointer self) -> gboolean {
                static_cast<SessionBus*>(self)->idle_ = 0;
                return G_SOURCE_REMOVE;
            },
            this);
    }
    began_ = Clock::now();
}

DBusHandlerResult SessionBus::Look(DBusConnection* /*connection*/, DBusMessage* message,
                                   void* data) {
    auto* self = static_cast<SessionBus*>(data);
    if (dbus_message_is_signal(message, DBUS_INTERFACE_LOCAL, "Disconnected")) {
        self->onLost_();
    }
    if (dbus_message_get_type(message) != DBUS_MESSAGE_TYPE_METHOD_CALL) {
        return DBUS_HANDLER_RESULT_NOT_YET_HANDLED;
    }
    // Behind a short call nobody has: to ask the bus would take as long as most calls.
    const bool hasWaited = self->idle_ != 0 && Clock::now() - self->began_ > kShortWait;
    const char* caller = dbus_message_get_sender(message);
    // A caller that wants no reply may leave before it is served.
    if (hasWaited && caller != nullptr && dbus_message_get_no_reply(message) == FALSE &&
        self->HasLeft(caller)) {
        return DBUS_HANDLER_RESULT_HANDLED;
    }
    self->Serve();
    return DBUS_HANDLER_RESULT_NOT_YET_HANDLED;
}

}  // namespace taviwireless::daemon
