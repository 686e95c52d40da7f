// SPDX-License-Identifier: MIT
#include "cli/modem/session_bus.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>

#include "cli/command_error.h"
#include "cli/modem/bus.h"
#include "cli/modem/trace.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

constexpr char kService[] = "com.merilond.usbmodem";
constexpr char kAddress[] = "DBUS_SESSION_BUS_ADDRESS";

bool IsThere(DBusConnection* bus) {
    BusFailure failure;
    return dbus_bus_name_has_owner(bus, kService, &failure.error) != FALSE;
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
    BusFailure failure;
    const Bus bus = FindSessionBus() ? ConnectToBus(failure) : nullptr;
    return bus && IsThere(bus.get());
}

void HangUpByBus(const std::string& id) {
    BusFailure failure;
    const Bus bus = ConnectToBus(failure);
    if (bus) {
        const Message call = NewCall(kService, "/", kService, "Disconnect", {id});
        dbus_message_set_no_reply(call.get(), TRUE);
        dbus_connection_send(bus.get(), call.get(), nullptr);
        dbus_connection_flush(bus.get());
    }
}

bool RequireService() {
    if (!FindSessionBus()) {
        FailWithoutBus();
    }
    BusFailure failure;
    const Bus bus = ConnectToBus(failure);
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
