// SPDX-License-Identifier: MIT
// The session bus, and the modem service on it.
#include <cstdlib>
#include <string>

#include "cli/doctor/check.h"
#include "cli/modem/bus.h"
#include "cli/modem/session_bus.h"

namespace taviwireless::cli {

namespace {

constexpr char kService[] = "com.merilond.usbmodem";

// Empty where there is none: the library would start one of its own that nobody else sees.
std::string BusAddress() {
    const char* address = FindSessionBus() ? getenv("DBUS_SESSION_BUS_ADDRESS") : nullptr;
    return address != nullptr ? address : "";
}

// Whether the bus lists the service's name in its answer to this.
bool Lists(DBusConnection* bus, const char* method) {
    constexpr int kTimeout = 2000;  // ms
    BusFailure failure;
    const Message call = NewCall(DBUS_SERVICE_DBUS, DBUS_PATH_DBUS, DBUS_INTERFACE_DBUS, method);
    const Message reply = Ask(bus, call, "as", failure, kTimeout);
    bool isListed = false;
    if (reply) {
        ForEachText(Content(reply), [&isListed](const char* name) {
            isListed = isListed || name == std::string(kService);
        });
    }
    return isListed;
}

Findings SessionBus() {
    if (BusAddress().empty()) {
        return Warning("this session has no bus, and DBUS_SESSION_BUS_ADDRESS names none",
                       "log in at the machine, or begin with dbus-run-session");
    }
    BusFailure failure;
    return ConnectToBus(failure) ? Ok(BusAddress())
                                 : Failed(BusAddress() + " cannot be reached: " + failure.Text(),
                                          "set DBUS_SESSION_BUS_ADDRESS to the address of yours");
}

Findings Service() {
    BusFailure failure;
    const Bus bus = BusAddress().empty() ? nullptr : ConnectToBus(failure);
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
    return {{"session bus", SessionBus}, {"modem service", Service}};
}

}  // namespace taviwireless::cli
