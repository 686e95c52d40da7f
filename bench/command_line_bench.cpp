// SPDX-License-Identifier: MIT
// What it costs to call the command line: its start alone, and a status beside the call of the bus
// that it makes. A line for each figure, "NAME VALUE UNIT": command_line_bench [NAME]
#include <dbus/dbus.h>
#include <taviwireless/dbus_client.h>

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
#include "tests/support/process.h"
#include "usbmodem/rules/objects.h"

namespace {

using namespace taviwireless::test;
namespace objects = taviwireless::usbmodem_lib::objects;
using taviwireless::dbus::DBusClient;
using Clock = std::chrono::steady_clock;

double MedianMilliseconds(const std::function<bool()>& run) {
    constexpr size_t kRuns = 101;
    std::vector<double> times;
    while (times.size() < kRuns) {
        const auto begin = Clock::now();
        if (!run()) {
            throw std::runtime_error("a run failed");
        }
        times.push_back(std::chrono::duration<double, std::milli>(Clock::now() - begin).count());
    }
    std::nth_element(times.begin(), times.begin() + kRuns / 2, times.end());
    return times[kRuns / 2];
}

std::function<bool()> Command(std::vector<std::string> argv) {
    argv.insert(argv.begin(), BuiltProgram("taviwireless"));
    return [argv] { return RunProgram(argv).status == 0; };
}

bool CallObjects() {
    DBusClient client(objects::kService, objects::kManager, "org.freedesktop.DBus.ObjectManager",
                      DBUS_BUS_SESSION);
    return client.NewMessage("GetManagedObjects") == 0 && client.SendMessage(true, -1) == 0;
}

}  // namespace

int main(int argc, char** argv) {
    taviwireless::EnterApplianceRoot();
    const ServedModems served("12d1,ports=dial/at");
    struct Figure {
        const char* name;
        std::function<bool()> run;
    };
    for (const auto& [name, run] :
         {Figure{"command_line_nothing", [] { return RunProgram({"/bin/true"}).status == 0; }},
          Figure{"command_line_version", Command({"--version"})},
          Figure{"command_line_status", Command({"modem", "status", "usbmodem0"})},
          Figure{"command_line_status_call", CallObjects}}) {
        if (argc < 2 || argv[1] == std::string(name)) {
            std::printf("%s %.3f ms\n", name, MedianMilliseconds(run));
        }
    }
}
