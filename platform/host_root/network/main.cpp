// SPDX-License-Identifier: MIT
// The network program of the host root, at /etc/rc.network.
#include <core/failure.h>
#include <sys/stat.h>

#include <csignal>
#include <cstdio>
#include <cstdlib>

#include "platform/host_root/network/error.h"
#include "platform/host_root/network/lock.h"
#include "platform/host_root/network/restart.h"

namespace taviwireless::network {

namespace {

constexpr int kFailure = 1;
constexpr int kUsage = 2;

// A restart that has begun is brought to its end: all its waits have one.
void KeepFromBeingInterrupted() {
    sigset_t signals;
    sigemptyset(&signals);
    for (const int number : {SIGHUP, SIGINT, SIGTERM, SIGALRM}) {
        sigaddset(&signals, number);
    }
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    signal(SIGPIPE, SIG_IGN);  // nobody may be left to read what is said
}

void Restart(const std::string& interface, const std::string& bridge) {
    const UniqueFd lock = TakeLock();
    KeepFromBeingInterrupted();
    FinishKilledRestart();
    const Plan plan = MakePlan(ReadSettings(interface, bridge));
    BringAbout(plan);
}

constexpr char kHelp[] =
    "Usage:\n"
    "  rc.network restart INTERFACE BRIDGE\n"
    "  rc.network --dry-run restart INTERFACE BRIDGE\n"
    "  rc.network --dry-run enable INTERFACE BRIDGE GUESTS MEMBER ADDRESS LEASES\n"
    "\n"
    "Makes the bridge, the access point and the bridge's DHCP server what the saved\n"
    "settings say, whatever they were before. What would cut the machine off is refused,\n"
    "and after a failure everything is as it was.\n"
    "\n"
    "Arguments:\n"
    "  INTERFACE  of the access point, such as wlan0\n"
    "  BRIDGE     such as lbr0; empty: the one that the interface is in, if any\n"
    "  GUESTS     yes or no: whether there will be a network for guests\n"
    "  MEMBER     interface that a new bridge will have; may be empty\n"
    "  ADDRESS    that the bridge will have, such as 10.1.14.1/24; may be empty\n"
    "  LEASES     yes or no: whether a DHCP server will run on the bridge\n"
    "\n"
    "Options:\n"
    "  --dry-run  print what would be done; enable: after the access point is enabled\n"
    "  --help     print this help\n"
    "\n"
    "Exit status:\n"
    "  0  done\n"
    "  1  failed\n"
    "  2  wrong usage\n";

int Main(const std::vector<std::string>& words) {
    if (words == std::vector<std::string>{"--help"}) {
        return fputs(kHelp, stdout) < 0 || fflush(stdout) != 0 ? kFailure : 0;
    }
    const bool isDryRun = !words.empty() && words[0] == "--dry-run";
    const size_t first = isDryRun ? 1 : 0;
    const std::string what = words.size() > first ? words[first] : "";
    const bool isRestart = what == "restart" && words.size() == first + 3;
    const bool isEnable = isDryRun && what == "enable" && words.size() == 8;
    if (!isRestart && !isEnable) {
        fputs(kHelp, stderr);
        return kUsage;
    }
    if (!isDryRun) {
        Restart(words[1], words[2]);
        return 0;
    }
    std::optional<Enabled> enabled;
    if (isEnable) {
        enabled = Enabled{words[4] == "yes", words[5], words[6], words[7] == "yes"};
    }
    const Plan plan = MakePlan(ReadSettings(words[2], words[3], enabled));
    fputs(Rendered(plan).c_str(), stdout);
    return 0;
}

int Guarded(const std::vector<std::string>& words) {
    try {
        return Main(words);
    } catch (const tavicore::Failure& failure) {
        fprintf(stderr, "rc.network: the kernel cannot be asked (error 0x%04X)\n",
                static_cast<unsigned int>(failure.code));
    } catch (const std::exception& error) {
        fprintf(stderr, "rc.network: %s\n", error.what());
    }
    return kFailure;
}

}  // namespace

}  // namespace taviwireless::network

int main(int argc, char** argv) {
    signal(SIGCHLD, SIG_DFL);  // ignored by the caller, no child's end could be waited for
    umask(022);
    setenv("PATH", "/usr/local/sbin:/usr/local/bin:/usr/sbin:/usr/bin:/sbin:/bin", 1);
    return taviwireless::network::Guarded({argv + 1, argv + argc});
}
