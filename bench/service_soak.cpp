// SPDX-License-Identifier: MIT
// The life of the service: modems are plugged in, unplugged, reset, babble, dial and hang up, and
// the service is restarted, in random order. After each step everything must be as it belongs, or
// the program ends with status 1 and prints the seed, with which the same order runs again. Time is
// compressed: a second of the service's own pauses lasts 50 ms.
//   service_soak [SEED [MINUTES]]      simulated minutes, 60 if not given
#include <signal.h>
#include <sys/stat.h>
#include <taviwireless/usbmodem_client.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <random>
#include <set>
#include <sstream>
#include <stdexcept>
#include <thread>

#include "platform/appliance_root/appliance_root.h"
#include "tests/support/bus.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"

namespace {

using namespace taviwireless::test;
using Clock = std::chrono::steady_clock;

constexpr int kModems = 3;
constexpr int kCompression = 20;

// Brings a link up as pppd does: an interface with an address, and the default route where the peer
// options let it. "ppp" and the number of the modem's dial port.
constexpr char kDialler[] = R"(#!/bin/sh
unset LD_PRELOAD
for argument; do
    case $argument in Modem=/dev/ttyUSB*) n=${argument#Modem=/dev/ttyUSB} ;; esac
done
ip link add "ppp$n" type veth peer name "far$n"
trap 'ip link delete "ppp$n"; exit' TERM
ip address add "10.64.$n.1/32" dev "ppp$n"
ip link set "ppp$n" up
grep -q nodefaultroute /etc/ppp/peers/wvdial || ip route replace default dev "ppp$n"
echo "--> Using interface ppp$n" >&2
echo "--> secondary DNS address 10.64.64.3" >&2
sleep 100000 &
wait
)";
constexpr char kMachine[] =
    "ip link add eth7 type veth peer name far-eth7; ip address add 10.7.0.2/24 dev eth7;"
    "ip link set eth7 up; ip link set far-eth7 up; ip route add default via 10.7.0.1";

struct Modem {
    bool isPlugged = true;
    bool isBabbling = false;
    bool isDialled = false;
};

class Life {
  public:
    explicit Life(unsigned seed) : random_(seed), simulator_(Modems()) {
        Shell(kMachine);
        WriteFile("/etc/ppp/peers/wvdial", "noauth\n");
        WriteProgram("/usr/tavi/bin/wvdial", kDialler);
        StartService();
        Settle();
        // One modem takes the default route.
        Call({"SetProfile", "usbmodem0", "default_gw=true"});
    }

    void Step() {
        const int id = Random(kModems);
        step_ = Act(id);
        ++counts_[step_];
        step_ += " " + std::to_string(id);
        Settle();
        std::this_thread::sleep_for(std::chrono::milliseconds(50 * Random(10)));
    }
    const std::string& LastStep() const { return step_; }

    void PrintState(int minutes) const {
        std::printf("%3d min: %ld kB of its own (at most %ld)", minutes, Memory(), mostMemory_);
        for (const auto& [name, count] : counts_) {
            std::printf(", %d %s", count, name.c_str());
        }
        std::puts("");
        std::fflush(stdout);
    }

  private:
    static std::vector<std::string> Modems() {
        return {"--modem", "12d1,id=0,ports=dial/at,imsi=001010000000000",
                "--modem", "generic,id=1,ports=dial/at,imsi=001010000000001",
                "--modem", "2001,id=2,ports=dial/at,imsi=001010000000002"};
    }
    int Random(int below) { return static_cast<int>(random_() % static_cast<unsigned>(below)); }

    static void Expect(bool isSo, const std::string& otherwise) {
        if (!isSo) {
            throw std::runtime_error(otherwise);
        }
    }
    static void Call(const std::vector<std::string>& methodAndArguments) {
        const RunResult result = CallService(methodAndArguments);
        Expect(result.status == 0, result.err);
    }
    void StartService() {
        setenv("LD_PRELOAD", SHORT_WAITS, 1);
        service_.emplace();
        unsetenv("LD_PRELOAD");
    }
    static std::string DevId(int id) { return "usbmodem" + std::to_string(id); }

    // Does something that can be done with the modem, and returns its name.
    std::string Act(int id) {
        Modem& modem = modems_[id];
        const std::string target = std::to_string(id);
        const int choice = Random(8);
        if (choice == 0) {
            service_->Daemon().Signal(SIGTERM);
            Expect(service_->Daemon().Wait() == 0, "the service does not end");
            const bool toggles = Random(2) == 0;
            if (toggles) {
                Toggle(modem, target);
            }
            StartService();
            return toggles ? "restarts with a change" : "restarts";
        }
        if (choice == 1 || !modem.isPlugged) {
            return Toggle(modem, target);
        }
        if (modem.isBabbling || choice == 2) {
            modem.isBabbling = !modem.isBabbling;
            simulator_.Fault(target + ".1", modem.isBabbling ? "babble" : "off");
            std::string document;
            client_.GetUSBModem(DevId(id), document);  // only who asks it notices
            return modem.isBabbling ? "babbles" : "quiets";
        }
        if (choice == 3) {
            simulator_.Unplug(target + ".1");
            simulator_.Plug(target + ".1");
            modem.isDialled = false;
            // Until then the list looks as it did.
            Until([&] { return !IsListed(id); }, "the reset is not noticed");
            return "resets";
        }
        if (choice < 6) {
            std::string document;
            Expect(client_.GetUSBModem(DevId(id), document) == 0, "a modem does not answer");
            return "requests";
        }
        Call({modem.isDialled ? "Disconnect" : "Connect", DevId(id)});
        modem.isDialled = !modem.isDialled;
        // Also after hanging up: it is this look that makes the modem ready to dial again.
        Until([&] { return IsConnected(id) == modem.isDialled; }, "the link does not change");
        return modem.isDialled ? "dials" : "hang-ups";
    }
    std::string Toggle(Modem& modem, const std::string& target) {
        if (modem.isPlugged) {
            simulator_.Unplug(target);
            modem.isDialled = false;
        } else {
            simulator_.Plug(target);
        }
        modem.isPlugged = !modem.isPlugged;
        return modem.isPlugged ? "plugs" : "unplugs";
    }
    bool IsConnected(int id) {
        std::string document;
        return client_.GetUSBModem(DevId(id), document) == 0 &&
               document.find("\"net_status\": \"connected\"") != std::string::npos;
    }
    std::set<std::string> Listed() {
        std::string list;
        client_.GetUSBModemList(list);
        std::istringstream lines(list);
        std::set<std::string> devids;
        for (std::string line; std::getline(lines, line);) {
            devids.insert(line);
        }
        return devids;
    }
    bool IsListed(int id) { return Listed().count(DevId(id)) > 0; }

    static void Until(const std::function<bool()>& isSo, const std::string& otherwise) {
        const auto end = Clock::now() + std::chrono::seconds(60);
        while (!isSo()) {
            Expect(Clock::now() < end, otherwise);
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
    }

    // Waits until everything is as it belongs. With the waits for silence as short as they are
    // here, a modem that babbles may pass for one that answers; nothing is said of that one.
    void Settle() {
        std::set<std::string> listed;
        std::set<std::string> babbling;
        long diallers = 0;
        for (int id = 0; id < kModems; ++id) {
            if (modems_[id].isPlugged) {
                (modems_[id].isBabbling ? babbling : listed).insert(DevId(id));
            }
            diallers += modems_[id].isDialled;
        }
        const std::string route =
            modems_[0].isDialled ? "default dev ppp0" : "default via 10.7.0.1";
        const long open = static_cast<long>(listed.size());
        const long mostOpen = open + static_cast<long>(babbling.size());
        const auto listedButBabbling = [&] {
            std::set<std::string> all = Listed();
            for (const std::string& devid : babbling) {
                all.erase(devid);
            }
            return all;
        };
        Until([&] { return listedButBabbling() == listed; }, "the list is not what is plugged in");
        Until([&] { return Number("pgrep -cx wvdial") == diallers; }, "not these diallers");
        Until([&] { return Shell("ip route show default").rfind(route, 0) == 0; },
              "the default route is not " + route);
        Until([&] { return Number("ls /var/lock | grep -c ^LCK..ttyUSB") <= mostOpen; },
              "lock files are left");
        Until([&] { return Number("awk 'NR > 1 && $1 == 0' /proc/sysvipc/sem | wc -l") == 0; },
              "semaphore sets are left");
        if (babbling.empty()) {
            const long most = descriptors_.emplace(open, Descriptors()).first->second;
            Until([&] { return Descriptors() <= most; }, "descriptors are left");
        }
        mostMemory_ = std::max(mostMemory_, Memory());
        Expect(mostMemory_ <= Memory() + 1024 && mostMemory_ < 8192, "memory grows");
    }
    static long Number(const std::string& command) {
        return std::stol(RunProgram({"sh", "-c", command}).out);
    }
    std::string ProcFile(const std::string& name) const {
        return "/proc/" + std::to_string(service_->Daemon().Pid()) + "/" + name;
    }
    long Descriptors() const {
        using Iterator = std::filesystem::directory_iterator;
        return std::distance(Iterator(ProcFile("fd")), Iterator());
    }
    long Memory() const {  // kilobytes
        const std::string status = ReadFile(ProcFile("status"));
        return std::stol(status.substr(status.find("RssAnon:") + 8));
    }

    std::mt19937 random_;
    PrivateBus bus_;
    ModemSimulator simulator_;
    mutable std::optional<ModemService> service_;
    taviwireless::dbus::USBModemClient client_;
    Modem modems_[kModems];
    std::string step_ = "start";
    std::map<std::string, int> counts_;
    std::map<long, long> descriptors_;  // by the number of modems in service
    long mostMemory_ = 0;
};

}  // namespace

int main(int argc, char** argv) {
    const auto seed = static_cast<unsigned>(argc > 1 ? std::atol(argv[1]) : std::random_device()());
    const int minutes = argc > 2 ? std::atoi(argv[2]) : 60;
    taviwireless::EnterApplianceRoot();
    std::printf("seed %u\n", seed);
    Life life(seed);
    const auto minute = std::chrono::seconds(60) / kCompression;
    const auto begin = Clock::now();
    try {
        for (int i = 1; i <= minutes; ++i) {
            while (Clock::now() < begin + i * minute) {
                life.Step();
            }
            life.PrintState(i);
        }
    } catch (const std::exception& error) {
        std::printf("seed %u, after %s: %s\n", seed, life.LastStep().c_str(), error.what());
        return EXIT_FAILURE;
    }
}
