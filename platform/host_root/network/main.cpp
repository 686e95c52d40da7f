// The network program of the host root, at /etc/rc.network:
//   rc.network restart INTERFACE BRIDGE
//   rc.network --dry-run restart INTERFACE BRIDGE
//   rc.network --dry-run enable INTERFACE BRIDGE GUESTS MEMBER ADDRESS LEASES
// Makes the bridge, the access point on the interface and the bridge's DHCP server what the saved
// settings say, whatever they were before. An empty BRIDGE is the one that the interface is in, if
// any. --dry-run prints what would be done.
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

int Usage() {
    fputs(
        "usage: rc.network restart INTERFACE BRIDGE\n"
        "       rc.network --dry-run restart INTERFACE BRIDGE\n"
        "       rc.network --dry-run enable INTERFACE BRIDGE GUESTS MEMBER ADDRESS LEASES\n",
        stderr);
    return kUsage;
}

int Main(const std::vector<std::string>& words) {
    const bool isDryRun = !words.empty() && words[0] == "--dry-run";
    const size_t first = isDryRun ? 1 : 0;
    const std::string what = words.size() > first ? words[first] : "";
    const bool isRestart = what == "restart" && words.size() == first + 3;
    const bool isEnable = isDryRun && what == "enable" && words.size() == 8;
    if (!isRestart && !isEnable) {
        return Usage();
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
