// SPDX-License-Identifier: MIT
// What the modem service costs: the round trip of a call beside one to the bus itself, the time
// from start to service and from plugging to ready, the daemon's memory and its wake-ups. On a
// private bus in an appliance root, with simulated modems. Prints a line "NAME VALUE UNIT" for each
// figure.
//   service_bench [PART]      calls, start, plugging, memory, wakeups; all, if none is given
#include <dbus/dbus.h>
#include <signal.h>
#include <taviwireless/usbmodem_client.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <functional>
#include <optional>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "platform/appliance_root/appliance_root.h"
#include "tests/support/bus.h"
#include "tests/support/modem_simulator.h"

namespace {

using namespace taviwireless::test;
using taviwireless::dbus::USBModemClient;
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

// Waits for the signal that the service's name has an owner, or has none any more.
void AwaitName(DBusConnection* bus, bool isOwned) {
    for (bool isSeen = false; !isSeen && dbus_connection_read_write(bus, -1) != FALSE;) {
        while (DBusMessage* message = dbus_connection_pop_message(bus)) {
            const char* name = nullptr;
            const char* before = nullptr;
            const char* now = nullptr;
            isSeen =
                isSeen ||
                (dbus_message_is_signal(message, DBUS_INTERFACE_DBUS, "NameOwnerChanged") &&
                 dbus_message_get_args(message, nullptr, DBUS_TYPE_STRING, &name, DBUS_TYPE_STRING,
                                       &before, DBUS_TYPE_STRING, &now, DBUS_TYPE_INVALID) &&
                 (*now != '\0') == isOwned);
            dbus_message_unref(message);
        }
    }
}

void PrintStart() {
    DBusConnection* bus = dbus_bus_get_private(DBUS_BUS_SESSION, nullptr);
    dbus_bus_add_match(bus, "type='signal',member='NameOwnerChanged',arg0='com.merilond.usbmodem'",
                       nullptr);
    dbus_connection_flush(bus);
    std::vector<double> times;
    for (int i = 0; i < 41; ++i) {
        const auto begin = Clock::now();
        Process service(Command());
        AwaitName(bus, true);
        times.push_back(Milliseconds(Clock::now() - begin));
        service.Signal(SIGTERM);
        service.Wait();
        AwaitName(bus, false);
    }
    Print("start_to_name", Median(times), "ms");
    dbus_connection_close(bus);
    dbus_connection_unref(bus);
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

// A value of the process's smaps_rollup, in MB.
double Memory(pid_t process, const std::string& name) {
    std::ifstream file("/proc/" + std::to_string(process) + "/smaps_rollup");
    for (std::string line; std::getline(file, line);) {
        if (line.rfind(name + ":", 0) == 0) {
            return std::stod(line.substr(name.size() + 1)) / 1024;
        }
    }
    throw std::runtime_error("no " + name);
}

// The service with so many modems, each asked everything once.
struct ServiceWith {
    explicit ServiceWith(int modems) : service(Command()) {
        std::vector<std::string> arguments;
        std::vector<std::string> devids;
        for (int i = 0; i < modems; ++i) {
            arguments.insert(arguments.end(), {"--modem", "12d1,ports=dial/at"});
            devids.push_back("usbmodem" + std::to_string(i));
        }
        if (modems > 0) {
            simulator.emplace(arguments);
        }
        for (int tries = 0; tries < 3 && !service.Lists(devids); ++tries) {
        }
        std::string document;
        for (const std::string& devid : devids) {
            USBModemClient().GetUSBModem(devid, document);
        }
    }

    ModemService service;
    std::optional<ModemSimulator> simulator;  // it would make one modem of no argument
};

// "Anonymous" is what the process has written to; of "Private_Dirty" the pages of a library that was
// just built are a part, until they are on the disk.
void PrintMemory() {
    for (const int modems : {0, 1, 8}) {
        ServiceWith with(modems);
        const pid_t process = with.service.Daemon().Pid();
        const std::string name = "memory_" + std::to_string(modems) + "_modems_";
        Print(name + "resident", Memory(process, "Rss"), "MB");
        Print(name + "written", Memory(process, "Anonymous"), "MB");
        Print(name + "unique", Memory(process, "Private_Clean") + Memory(process, "Private_Dirty"),
              "MB");
    }
}

// How often the threads of a process have waited for something.
long Waits(pid_t process) {
    long waits = 0;
    for (const auto& thread :
         std::filesystem::directory_iterator("/proc/" + std::to_string(process) + "/task")) {
        std::ifstream file(thread.path() / "status");
        for (std::string line; std::getline(file, line);) {
            if (line.rfind("voluntary_ctxt_switches:", 0) == 0) {
                waits += std::stol(line.substr(line.find(':') + 1));
            }
        }
    }
    return waits;
}

// Without anybody who listens.
void PrintWakeups() {
    for (const int modems : {0, 1}) {
        ServiceWith with(modems);
        const pid_t process = with.service.Daemon().Pid();
        std::this_thread::sleep_for(std::chrono::seconds(10));  // until its first look is over
        const long before = Waits(process);
        std::this_thread::sleep_for(std::chrono::minutes(1));
        Print("wakeups_" + std::to_string(modems) + "_modems",
              static_cast<double>(Waits(process) - before), "per_minute");
    }
}

}  // namespace

int main(int argc, char** argv) {
    taviwireless::EnterApplianceRoot();
    PrivateBus bus;
    const std::pair<const char*, void (*)()> kParts[] = {{"calls", PrintCalls},
                                                         {"start", PrintStart},
                                                         {"plugging", PrintPlugging},
                                                         {"memory", PrintMemory},
                                                         {"wakeups", PrintWakeups}};
    for (const auto& [name, print] : kParts) {
        if (argc < 2 || std::strcmp(argv[1], name) == 0) {
            print();
        }
    }
}
