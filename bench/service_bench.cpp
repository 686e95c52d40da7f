// SPDX-License-Identifier: MIT
// What the modem service costs: the round trip of a call beside one to the bus itself, and the time
// from plugging to ready. On a private bus in an appliance root, with a simulated modem. Prints a
// line "NAME VALUE UNIT" for each figure.
//   service_bench [PART]      calls or plugging; both, if none is given
#include <dbus/dbus.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

#include "platform/appliance_root/appliance_root.h"
#include "tests/support/bus.h"
#include "tests/support/modem_simulator.h"

namespace {

using namespace taviwireless::test;
using Clock = std::chrono::steady_clock;

double Milliseconds(Clock::duration time) {
    return std::chrono::duration<double, std::milli>(time).count();
}

double Median(std::vector<double> values) {
    std::sort(values.begin(), values.end());
    return values[values.size() / 2];
}

void Print(const std::string& name, double value, const char* unit) {
    std::printf("%s %.3f %s\n", name.c_str(), value, unit);
}

// As an appliance runs it, and not with the short waits of the tests, which are a library more.
std::vector<std::string> Command() {
    return {BuiltProgram("usbmodemd"), "--foreground"};
}

// A call of a method with one argument, or none, whose reply is not looked at.
void Call(DBusConnection* bus, const char* name, const char* path, const char* interface,
          const char* method, const char* argument) {
    DBusMessage* call = dbus_message_new_method_call(name, path, interface, method);
    if (argument != nullptr) {
        dbus_message_append_args(call, DBUS_TYPE_STRING, &argument, DBUS_TYPE_INVALID);
    }
    DBusMessage* reply = dbus_connection_send_with_reply_and_block(bus, call, -1, nullptr);
    if (reply == nullptr) {
        throw std::runtime_error(std::string(method) + " failed");
    }
    dbus_message_unref(reply);
    dbus_message_unref(call);
}

void PrintCalls() {
    ModemSimulator simulator({"--modem", "12d1,ports=dial/at"});
    ModemService service(Command());
    service.Lists({"usbmodem0"});
    DBusConnection* bus = dbus_bus_get(DBUS_BUS_SESSION, nullptr);
    const char* kModem = "com.merilond.usbmodem";
    const std::pair<const char*, std::function<void()>> calls[] = {
        {"bus",
         [&] {
             Call(bus, DBUS_SERVICE_DBUS, DBUS_PATH_DBUS, DBUS_INTERFACE_DBUS, "GetId", nullptr);
         }},
        {"list", [&] { Call(bus, kModem, "/", kModem, "GetUSBModemList", nullptr); }},
        {"profile", [&] { Call(bus, kModem, "/", kModem, "GetProfile", "usbmodem0"); }},
        {"known_document",
         [&] {
             Call(bus, "com.merilond.usbmodem.Objects", "/com/merilond/usbmodem/usbmodem0",
                  DBUS_INTERFACE_PROPERTIES, "GetAll", "com.merilond.usbmodem.Modem");
         }},
    };
    constexpr int kRuns = 2001;
    std::vector<double> times[std::size(calls)];
    for (int i = 0; i < kRuns; ++i) {  // in turns, since the machine may have others to serve
        for (size_t call = 0; call < std::size(calls); ++call) {
            const auto begin = Clock::now();
            calls[call].second();
            times[call].push_back(Milliseconds(Clock::now() - begin));
        }
    }
    const double own = Median(times[0]);
    for (size_t call = 0; call < std::size(calls); ++call) {
        Print(std::string("call_") + calls[call].first, Median(times[call]), "ms");
        Print(std::string("call_") + calls[call].first + "_ratio", Median(times[call]) / own,
              "times");
    }
}

void PrintPlugging() {
    ModemService service(Command());
    std::vector<double> times;
    for (int i = 0; i < 3; ++i) {
        const auto begin = Clock::now();
        ModemSimulator simulator({"--modem", "12d1,ports=dial/at"});
        service.Lists({"usbmodem0"});
        times.push_back(Milliseconds(Clock::now() - begin));
        simulator.Unplug("0");
        service.Lists({});
    }
    Print("info_file_to_ready", Median(times), "ms");
}

}  // namespace

int main(int argc, char** argv) {
    taviwireless::EnterApplianceRoot();
    PrivateBus bus;
    const std::string part = argc > 1 ? argv[1] : "";
    if (part != "plugging") {
        PrintCalls();
    }
    if (part != "calls") {
        PrintPlugging();
    }
}
