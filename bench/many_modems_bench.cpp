// SPDX-License-Identifier: MIT
// How the cost of the modem service grows with the modems that are plugged in: many_modems_bench
// [NUMBER...], of 1, 10 and 100 if none is named. Prints NAME_NUMBER VALUE UNIT: the start until the
// name is owned, from there until all are listed, one call of the list, the daemon's memory, resident
// and written by itself, its descriptors, and how often it wakes up while nothing happens. On a private bus in an appliance
// root, with simulated modems. The service does not look at its modems by itself (--refresh 0),
// which takes 3 s for each, one after the other.
#include <taviwireless/usbmodem_client.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <optional>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "platform/appliance_root/appliance_root.h"
#include "tests/support/bus.h"
#include "tests/support/modem_simulator.h"

namespace {

namespace fs = std::filesystem;
using namespace taviwireless::test;
using Clock = std::chrono::steady_clock;

double Milliseconds(Clock::duration time) {
    return std::chrono::duration<double, std::milli>(time).count();
}

void Print(const char* name, int modems, double value, const char* unit) {
    std::printf("%s_%d %.3f %s\n", name, modems, value, unit);
    std::fflush(stdout);
}

// The sum of the numbers behind these words in a file of /proc.
double Sum(const fs::path& file, const std::vector<std::string>& words) {
    std::ifstream lines(file);
    double sum = 0;
    for (std::string word; lines >> word;) {
        double number = 0;
        if (std::find(words.begin(), words.end(), word) != words.end() && lines >> number) {
            sum += number;
        }
    }
    return sum;
}

double WakeUps(const fs::path& process) {
    double sum = 0;
    for (const auto& task : fs::directory_iterator(process / "task")) {
        sum += Sum(task.path() / "status", {"voluntary_ctxt_switches:"});
    }
    return sum;
}

double ListCall() {
    taviwireless::dbus::USBModemClient client;
    std::vector<double> times;
    for (int i = 0; i < 501; ++i) {
        std::string list;
        const auto begin = Clock::now();
        if (client.GetUSBModemList(list) != 0) {
            throw std::runtime_error("a call failed");
        }
        times.push_back(Milliseconds(Clock::now() - begin));
    }
    std::nth_element(times.begin(), times.begin() + 250, times.end());
    return times[250];
}

void Measure(int modems) {
    std::vector<std::string> arguments;
    for (int i = 0; i < modems; ++i) {
        arguments.insert(arguments.end(), {"--modem", "12d1,ports=dial/at"});
    }
    std::optional<ModemSimulator> simulator;  // it would make one modem of no argument
    if (modems > 0) {
        simulator.emplace(arguments);
    }
    auto begin = Clock::now();
    ModemService service(
        {"sh", "-c", "exec \"$0\" --foreground --refresh 0 2>&1", BuiltProgram("usbmodemd")});
    Print("start", modems, Milliseconds(Clock::now() - begin), "ms");
    begin = Clock::now();
    for (int i = 0; i < modems; ++i) {
        if (!service.Says("is ready")) {
            throw std::runtime_error("a modem does not get ready: " + service.Log());
        }
    }
    Print("all_listed", modems, Milliseconds(Clock::now() - begin) / 1000, "s");
    Print("list_call", modems, ListCall(), "ms");
    const fs::path process = "/proc/" + std::to_string(service.Daemon().Pid());
    const fs::path memory = process / "smaps_rollup";
    Print("resident", modems, Sum(memory, {"Rss:"}) / 1024, "MB");
    Print("own", modems, Sum(memory, {"Anonymous:"}) / 1024, "MB");
    const fs::directory_iterator descriptors(process / "fd");
    Print("descriptors", modems, static_cast<double>(std::distance(descriptors, {})),
          "descriptors");
    const double before = WakeUps(process);
    std::this_thread::sleep_for(std::chrono::seconds(30));
    Print("wake_ups", modems, (WakeUps(process) - before) * 2, "a_minute");
}

}  // namespace

int main(int argc, char** argv) {
    taviwireless::EnterApplianceRoot();
    PrivateBus bus;
    std::vector<int> numbers;
    for (int i = 1; i < argc; ++i) {
        numbers.push_back(std::atoi(argv[i]));
    }
    for (const int modems : numbers.empty() ? std::vector<int>{1, 10, 100} : numbers) {
        Measure(modems);
    }
}
