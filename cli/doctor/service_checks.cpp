// SPDX-License-Identifier: MIT
// The session bus, and the modem service on it.
#include <gio/gio.h>

#include <cstdlib>
#include <memory>
#include <string>

#include "cli/doctor/check.h"
#include "cli/modem/session_bus.h"

namespace taviwireless::cli {

namespace {

constexpr char kService[] = "com.merilond.usbmodem";

struct Release {
    void operator()(GDBusConnection* connection) const { g_object_unref(connection); }
    void operator()(GVariant* value) const { g_variant_unref(value); }
    void operator()(GError* error) const { g_error_free(error); }
};
template <typename Object>
using Owned = std::unique_ptr<Object, Release>;

// Empty where there is none: the library would start one of its own that nobody else sees.
std::string BusAddress() {
    const char* address = FindSessionBus() ? getenv("DBUS_SESSION_BUS_ADDRESS") : nullptr;
    return address != nullptr ? address : "";
}

Owned<GDBusConnection> Connect(std::string& reason) {
    GError* error = nullptr;
    Owned<GDBusConnection> connection(g_dbus_connection_new_for_address_sync(
        BusAddress().c_str(),
        static_cast<GDBusConnectionFlags>(G_DBUS_CONNECTION_FLAGS_AUTHENTICATION_CLIENT |
                                          G_DBUS_CONNECTION_FLAGS_MESSAGE_BUS_CONNECTION),
        nullptr, nullptr, &error));
    if (const Owned<GError> failure{error}) {
        reason = failure->message;
    }
    return connection;
}

// Whether the bus lists the service's name in its answer to this.
bool Lists(GDBusConnection* bus, const char* method) {
    constexpr int kTimeout = 2000;  // ms
    const Owned<GVariant> reply(g_dbus_connection_call_sync(
        bus, "org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", method,
        nullptr, G_VARIANT_TYPE("(as)"), G_DBUS_CALL_FLAGS_NONE, kTimeout, nullptr, nullptr));
    if (!reply) {
        return false;
    }
    GVariantIter* names = nullptr;
    const char* name = nullptr;
    bool isListed = false;
    g_variant_get(reply.get(), "(as)", &names);
    while (g_variant_iter_loop(names, "&s", &name)) {
        isListed = isListed || name == std::string(kService);
    }
    g_variant_iter_free(names);
    return isListed;
}

Findings Bus() {
    if (BusAddress().empty()) {
        return Warning("this session has no bus, and DBUS_SESSION_BUS_ADDRESS names none",
                       "log in at the machine, or begin with dbus-run-session");
    }
    std::string reason;
    return Connect(reason) ? Ok(BusAddress())
                           : Failed(BusAddress() + " cannot be reached: " + reason,
                                    "set DBUS_SESSION_BUS_ADDRESS to the address of yours");
}

Findings Service() {
    std::string reason;
    const auto bus = BusAddress().empty() ? nullptr : Connect(reason);
    if (!bus) {
        return Unknown("there is no bus to ask");
    }
    if (Lists(bus.get(), "ListNames")) {
        return Ok("runs");
    }
    return Lists(bus.get(), "ListActivatableNames")
               ? Ok("does not run; the bus starts it when it is called")
               : Warning("does not run, and this bus cannot start it",
                         "systemctl --user start usbmodemd, or usbmodemd");
}

}  // namespace

Checks ServiceChecks() {
    return {{"session bus", Bus}, {"modem service", Service}};
}

}  // namespace taviwireless::cli
