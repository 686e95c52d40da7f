// SPDX-License-Identifier: MIT
// By libdbus: GIO would need a thread, and ends the program where none can be had.
#include "cli/modem/session_bus.h"

#include <dbus/dbus.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <memory>

#include "cli/command_error.h"
#include "cli/modem/trace.h"
#include "cli/terminal.h"
#include "usbmodem/rules/objects.h"

namespace taviwireless::cli {

namespace {

namespace objects = usbmodem_lib::objects;

constexpr char kService[] = "com.merilond.usbmodem";
constexpr char kAddress[] = "DBUS_SESSION_BUS_ADDRESS";

struct Failure {
    Failure() { dbus_error_init(&error); }
    ~Failure() { dbus_error_free(&error); }
    Failure(const Failure&) = delete;
    Failure& operator=(const Failure&) = delete;

    bool Is(const char* name) const { return dbus_error_has_name(&error, name) != FALSE; }
    std::string Text() const { return Printable(error.message != nullptr ? error.message : ""); }

    DBusError error;
};

// A connection of its own, so that nothing waits behind the calls of others.
struct Close {
    void operator()(DBusConnection* connection) const {
        dbus_connection_close(connection);
        dbus_connection_unref(connection);
    }
};
using Bus = std::unique_ptr<DBusConnection, Close>;

Bus Connect(Failure& failure) {
    Bus bus(dbus_bus_get_private(DBUS_BUS_SESSION, &failure.error));
    if (bus) {
        dbus_connection_set_exit_on_disconnect(bus.get(), FALSE);
    }
    return bus;
}

bool IsThere(DBusConnection* bus) {
    Failure failure;
    return dbus_bus_name_has_owner(bus, kService, &failure.error) != FALSE;
}

using Message = std::unique_ptr<DBusMessage, void (*)(DBusMessage*)>;

Message Call(const std::string& service, const std::string& path, const std::string& interface,
             const char* method, const char* first, const char* second = nullptr) {
    Message call(
        dbus_message_new_method_call(service.c_str(), path.c_str(), interface.c_str(), method),
        dbus_message_unref);
    if (!call || !dbus_message_append_args(call.get(), DBUS_TYPE_STRING, &first,
                                           second != nullptr ? DBUS_TYPE_STRING : DBUS_TYPE_INVALID,
                                           &second, DBUS_TYPE_INVALID)) {
        throw std::bad_alloc();
    }
    return call;
}

[[noreturn]] void FailWithoutBus() {
    throw CommandError(
        kNoService,
        "there is no session bus here, where the modem service is: DBUS_SESSION_BUS_ADDRESS is "
        "not set, as over ssh or with sudo; keep it with sudo -E, start a bus with "
        "dbus-run-session, or add --direct to do without the service");
}

}  // namespace

bool FindSessionBus() {
    const char* address = getenv(kAddress);
    if (address != nullptr && *address != '\0') {
        return true;
    }
    const char* folder = getenv("XDG_RUNTIME_DIR");
    for (const std::string& path : {folder != nullptr ? folder + std::string("/bus") : "",
                                    "/run/user/" + std::to_string(geteuid()) + "/bus"}) {
        struct stat status {};
        if (stat(path.c_str(), &status) == 0 && S_ISSOCK(status.st_mode) &&
            status.st_uid == geteuid()) {
            setenv(kAddress, ("unix:path=" + path).c_str(), 1);
            Trace("the session bus is " + path);
            return true;
        }
    }
    return false;
}

bool IsServiceThere() {
    Failure failure;
    const Bus bus = FindSessionBus() ? Connect(failure) : nullptr;
    return bus && IsThere(bus.get());
}

void HangUpByBus(const std::string& id) {
    Failure failure;
    const Bus bus = Connect(failure);
    if (bus) {
        const Message call = Call(kService, "/", kService, "Disconnect", id.c_str());
        dbus_message_set_no_reply(call.get(), TRUE);
        dbus_connection_send(bus.get(), call.get(), nullptr);
        dbus_connection_flush(bus.get());
    }
}

std::string TextProperty(const std::string& id, const char* property) {
    const std::string path = std::string(objects::kManager) + '/' + id;
    if (!dbus_validate_path(path.c_str(), nullptr)) {
        return "";  // libdbus would end the program
    }
    Failure failure;
    const Bus bus = Connect(failure);
    const Message call =
        Call(objects::kService, path, DBUS_INTERFACE_PROPERTIES, "Get", objects::kModem, property);
    dbus_message_set_auto_start(call.get(), FALSE);
    const Message reply(bus ? dbus_connection_send_with_reply_and_block(
                                  bus.get(), call.get(), DBUS_TIMEOUT_USE_DEFAULT, &failure.error)
                            : nullptr,
                        dbus_message_unref);
    DBusMessageIter value;
    DBusMessageIter text;
    if (!reply || !dbus_message_iter_init(reply.get(), &value) ||
        dbus_message_iter_get_arg_type(&value) != DBUS_TYPE_VARIANT) {
        return "";
    }
    dbus_message_iter_recurse(&value, &text);
    const char* result = "";
    if (dbus_message_iter_get_arg_type(&text) == DBUS_TYPE_STRING) {
        dbus_message_iter_get_basic(&text, &result);
    }
    return result;
}

bool RequireService() {
    if (!FindSessionBus()) {
        FailWithoutBus();
    }
    Failure failure;
    const Bus bus = Connect(failure);
    if (!bus) {
        const char* address = getenv(kAddress);
        throw CommandError(kNoService, "cannot reach the session bus at " +
                                           Printable(address != nullptr ? address : "") + ": " +
                                           failure.Text() + "; --direct does without it");
    }
    if (IsThere(bus.get())) {
        return false;
    }
    ShowProgress("Starting the modem service ...");
    constexpr unsigned int kNoFlags = 0;
    if (!dbus_bus_start_service_by_name(bus.get(), kService, kNoFlags, nullptr, &failure.error)) {
        throw CommandError(kNoService,
                           "the modem service is not running; usbmodemd starts it (or add "
                           "--direct to do without it)" +
                               (failure.Is(DBUS_ERROR_SERVICE_UNKNOWN)
                                    ? ""
                                    : "; the bus could not: " + failure.Text()));
    }
    Trace("the bus has started the modem service");
    return true;
}

}  // namespace taviwireless::cli
