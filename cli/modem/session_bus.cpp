#include "cli/modem/session_bus.h"

#include <gio/gio.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <memory>
#include <thread>

#include "cli/command_error.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/service_objects.h"
#include "cli/modem/trace.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

constexpr char kService[] = "com.merilond.usbmodem";
constexpr int kPatience = 30000;  // milliseconds, until a service was started
constexpr char kAddress[] = "DBUS_SESSION_BUS_ADDRESS";

struct Failure {
    GError* error = nullptr;
    ~Failure() { g_clear_error(&error); }
    std::string Text() const { return error != nullptr ? error->message : ""; }
};
using Bus = std::unique_ptr<GDBusConnection, void (*)(gpointer)>;

Bus Connect(Failure& failure) {
    Bus bus(g_bus_get_sync(G_BUS_TYPE_SESSION, nullptr, &failure.error), g_object_unref);
    if (bus) {
        g_dbus_connection_set_exit_on_close(bus.get(), FALSE);
    }
    return bus;
}

// Calls a method of the bus itself. Returns its number or yes; nothing on failure.
std::optional<guint> AskBus(GDBusConnection* bus, const char* method, GVariant* arguments,
                            const char* type, Failure& failure) {
    const std::unique_ptr<GVariant, void (*)(GVariant*)> reply(
        g_dbus_connection_call_sync(bus, "org.freedesktop.DBus", "/org/freedesktop/DBus",
                                    "org.freedesktop.DBus", method, arguments, G_VARIANT_TYPE(type),
                                    G_DBUS_CALL_FLAGS_NONE, kPatience, nullptr, &failure.error),
        g_variant_unref);
    if (!reply) {
        return std::nullopt;
    }
    const std::unique_ptr<GVariant, void (*)(GVariant*)> value(
        g_variant_get_child_value(reply.get(), 0), g_variant_unref);
    return g_variant_is_of_type(value.get(), G_VARIANT_TYPE_BOOLEAN)
               ? static_cast<guint>(g_variant_get_boolean(value.get()))
               : g_variant_get_uint32(value.get());
}

bool IsThere(GDBusConnection* bus) {
    Failure failure;
    return AskBus(bus, "NameHasOwner", g_variant_new("(s)", kService), "(b)", failure)
               .value_or(0) != 0;
}

// One that was just started looks for its modems first.
void WaitForModems() {
    constexpr auto kPatience = std::chrono::seconds(10);
    const auto end = std::chrono::steady_clock::now() + kPatience;
    ServiceObjects objects;
    for (;;) {
        const auto modems = objects.Read();
        bool allAnswer = modems && modems->size() >= PluggedModems().size();
        for (const auto& modem : modems.value_or(std::map<std::string, KnownModem>())) {
            allAnswer = allAnswer && modem.second.answers;
        }
        if (allAnswer || std::chrono::steady_clock::now() > end) {
            return;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
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
    const Bus bus = FindSessionBus() ? Connect(failure) : Bus(nullptr, g_object_unref);
    return bus && IsThere(bus.get());
}

void HangUpByBus(const std::string& id) {
    Failure failure;
    const Bus bus = Connect(failure);
    if (bus) {
        g_dbus_connection_call(bus.get(), kService, "/", kService, "Disconnect",
                               g_variant_new("(s)", id.c_str()), nullptr, G_DBUS_CALL_FLAGS_NONE,
                               -1, nullptr, nullptr, nullptr);
        g_dbus_connection_flush_sync(bus.get(), nullptr, nullptr);
    }
}

void RequireService() {
    if (!FindSessionBus()) {
        FailWithoutBus();
    }
    Failure failure;
    const Bus bus = Connect(failure);
    if (!bus) {
        throw CommandError(kNoService,
                           "cannot reach the session bus at " + Printable(getenv(kAddress)) + ": " +
                               Printable(failure.Text()) + "; --direct does without it");
    }
    if (IsThere(bus.get())) {
        return;
    }
    ShowProgress("Starting the modem service ...");
    constexpr guint kNoFlags = 0;
    if (!AskBus(bus.get(), "StartServiceByName", g_variant_new("(su)", kService, kNoFlags), "(u)",
                failure)) {
        const bool isUnknown =
            g_error_matches(failure.error, G_DBUS_ERROR, G_DBUS_ERROR_SERVICE_UNKNOWN) != FALSE;
        g_dbus_error_strip_remote_error(failure.error);
        throw CommandError(
            kNoService,
            "the modem service is not running; usbmodemd starts it (or add "
            "--direct to do without it)" +
                (isUnknown ? "" : "; the bus could not: " + Printable(failure.Text())));
    }
    Trace("the bus has started the modem service");
    WaitForModems();
}

}  // namespace taviwireless::cli
