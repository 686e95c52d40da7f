// Ten thousand status requests on usbmodem0, about 50,000 AT commands: what the daemon holds before
// and after, and the most semaphore sets there were. The waits for silence are cut to 10 ms each,
// which otherwise would take seven hours: service_soak [REQUESTS]
#include <sys/sem.h>
#include <taviwireless/usbmodem_client.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <stdexcept>

#include "platform/root/appliance_root.h"
#include "tests/support/bus.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"

namespace {

using namespace taviwireless::test;

void PrintState(int requests, pid_t process, int mostSets) {
    using Iterator = std::filesystem::directory_iterator;
    const std::string folder = "/proc/" + std::to_string(process);
    const std::string status = ReadFile(folder + "/status");
    std::printf("%6d requests: %ld kB of its own, %ld descriptors, at most %d semaphore sets\n",
                requests, std::stol(status.substr(status.find("RssAnon:") + 8)),
                std::distance(Iterator(folder + "/fd"), Iterator()), mostSets);
    std::fflush(stdout);
}

int CountSets() {
    seminfo info{};
    semctl(0, 0, SEM_INFO, &info);
    return info.semusz;  // with SEM_INFO: the number of sets there are
}

}  // namespace

int main(int argc, char** argv) {
    constexpr int kSteps = 10;
    const int requests = argc > 1 ? std::atoi(argv[1]) : 10000;
    taviwireless::EnterApplianceRoot();
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "12d1,ports=dial/at"});
    setenv("LD_PRELOAD", SHORT_WAITS, 1);
    ModemService service;
    unsetenv("LD_PRELOAD");
    service.Lists({"usbmodem0"});
    taviwireless::dbus::USBModemClient client;
    std::string document;
    int mostSets = 0;
    for (int i = 0; i <= requests; ++i) {
        if (client.GetUSBModem("usbmodem0", document) != 0 ||
            document.find("\"signal\": 54") == std::string::npos) {
            throw std::runtime_error("request " + std::to_string(i) + ": " + document);
        }
        mostSets = std::max(mostSets, CountSets());
        if (i % std::max(requests / kSteps, 1) == 0) {
            PrintState(i, service.Daemon().Pid(), mostSets);
        }
    }
}
