// SPDX-License-Identifier: MIT
// What the modem service costs: the round trip of a call beside one to the bus itself, the time
// from start to service and from plugging to ready, and the daemon's memory. On a private bus in an
// appliance root, with simulated modems.
#include <dbus/dbus.h>
#include <signal.h>
#include <taviwireless/usbmodem_client.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
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
using taviwireless::dbus::DBusClient;
using taviwireless::dbus::USBModemClient;
using Clock = std::chrono::steady_clock;

double Milliseconds(Clock::duration time) {
    return std::chrono::duration<double, std::milli>(time).count();
}

// The median of so many runs, in milliseconds.
double Median(int runs, const std::function<double()>& run) {
    std::vector<double> times;
    for (int i = 0; i < runs; ++i) {
        times.push_back(run());
    }
    std::nth_element(times.begin(), times.begin() + runs / 2, times.end());
    return times[static_cast<size_t>(runs) / 2];
}

double RoundTrip(const std::function<bool()>& call) {
    constexpr int kRuns = 2001;
    return Median(kRuns, [&call] {
        const auto begin = Clock::now();
        if (!call()) {
            throw std::runtime_error("a call failed");
        }
        return Milliseconds(Clock::now() - begin);
    });
}

void PrintRoundTrips() {
    ModemSimulator simulator({"--modem", "12d1,ports=dial/at"});
    ModemService service;
    service.Lists({"usbmodem0"});
    DBusClient bus(DBUS_SERVICE_DBUS, DBUS_PATH_DBUS, DBUS_INTERFACE_DBUS, DBUS_BUS_SESSION);
    USBModemClient client;
    std::string reply;
    const double own = RoundTrip([&] {
        return bus.NewMessage("GetId") == 0 && bus.SendMessage(true, -1) == 0 &&
               bus.GetReply(reply) == 0;
    });
    std::printf("%-34s %8.3f ms\n", "call of the bus (GetId)", own);
    const double list = RoundTrip([&] { return client.GetUSBModemList(reply) == 0; });
    std::printf("%-34s %8.3f ms  %4.1f times the bus's\n", "GetUSBModemList", list, list / own);
    const double profile = RoundTrip([&] { return client.GetProfile("usbmodem0", reply) == 0; });
    std::printf("%-34s %8.3f ms  %4.1f times the bus's, %zu bytes\n", "GetProfile", profile,
                profile / own, reply.size());
}

void PrintStart() {
    const double start = Median(21, [] {
        const auto begin = Clock::now();
        ModemService service;
        const auto end = Clock::now();
        service.Daemon().Signal(SIGTERM);
        service.Daemon().Wait();
        while (USBModemClient().IsServerReady()) {
        }
        return Milliseconds(end - begin);
    });
    std::printf("%-34s %8.1f ms\n", "start to name owned", start);
}

void PrintPlugging() {
    ModemService service;
    const double ready = Median(3, [&service] {
        const auto begin = Clock::now();
        ModemSimulator simulator({"--modem", "12d1,ports=dial/at"});
        service.Lists({"usbmodem0"});
        const auto end = Clock::now();
        simulator.Unplug("0");
        service.Lists({});
        return Milliseconds(end - begin);
    });
    std::printf("%-34s %8.1f ms\n", "info file to ready", ready);
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

void PrintMemory(int modems) {
    std::vector<std::string> arguments;
    std::vector<std::string> devids;
    for (int i = 0; i < modems; ++i) {
        arguments.insert(arguments.end(), {"--modem", "12d1,ports=dial/at"});
        devids.push_back("usbmodem" + std::to_string(i));
    }
    std::optional<ModemSimulator> simulator;  // it would make one modem of no argument
    if (modems > 0) {
        simulator.emplace(arguments);
    }
    ModemService service;
    for (int tries = 0; tries < 3 && !service.Lists(devids); ++tries) {
    }
    std::string document;
    for (const std::string& devid : devids) {
        USBModemClient().GetUSBModem(devid, document);
    }
    const pid_t process = service.Daemon().Pid();
    std::printf(
        "memory with %d modems: resident %.1f MB, its share of shared pages counted %.1f MB, its "
        "own %.1f MB\n",
        modems, Memory(process, "Rss"), Memory(process, "Pss"), Memory(process, "Private_Dirty"));
}

}  // namespace

int main() {
    taviwireless::EnterApplianceRoot();
    PrivateBus bus;
    PrintRoundTrips();
    PrintStart();
    PrintPlugging();
    for (const int modems : {0, 1, 8}) {
        PrintMemory(modems);
    }
}
