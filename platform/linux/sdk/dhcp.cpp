// SPDX-License-Identifier: MIT
// Addresses by DHCP, from udhcpc. It stays in the background to renew its lease, and calls a script
// of the host root that sets the address and keeps what is known of the lease.
#include <sys/stat.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavicore/process.h>
#include <tavisdk/network.h>

#include <chrono>
#include <csignal>
#include <fstream>
#include <string>
#include <thread>

#include "core/failure.h"
#include "core/pid_file.h"
#include "sdk/dhcp_client.h"
#include "sdk/netlink.h"

using namespace tavicore;
using namespace tavisdk;

namespace {

constexpr char kFolder[] = "/etc/dhcpc";
constexpr char kLeaseScript[] = "/usr/tavi/bin/dhcp-lease";
constexpr char kClientName[] = "udhcpc";

// Gives up after four questions, 12 s; its messages go to the system log alone.
constexpr char kRunClient[] = "exec udhcpc -S -n -t 4 -T 3 \"$@\" >/dev/null 2>&1";

std::string FileOf(const char* interface, const char* suffix) {
    return std::string(kFolder) + "/dhcpcd-" + interface + suffix;
}

std::string PidFileOf(const char* interface) {
    return FileOf(interface, ".pid");
}

// Whether the client runs. The number in the pid file may be another program's by now, since the
// client writes the number alone.
bool ClientRuns(const char* interface) {
    const std::string file = PidFileOf(interface);
    if (VEXACProcAliveByPidFile(file.c_str()) == 0) {
        return false;
    }
    std::ifstream status("/proc/" + std::to_string(VEXACReadPidFile(file.c_str())) + "/comm");
    std::string name;
    return std::getline(status, name) && name == kClientName;
}

// Waits until the pid file names the client: its parent, whose number stands there at first, ends
// before the client has written its own.
bool ClientSettles(const char* interface) {
    constexpr int kMostLooks = 200;
    for (int i = 0; i < kMostLooks && !ClientRuns(interface); ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    return ClientRuns(interface);
}

bool RunClient(const char* interface) {
    mkdir(kFolder, 0755);  // it mostly exists
    const std::string pidFile = PidFileOf(interface);
    if (VEXACExec("/bin/sh", "-c", kRunClient, kClientName, "-i", interface, "-s", kLeaseScript,
                  "-p", pidFile.c_str(), nullptr) != 0 ||
        !ClientSettles(interface)) {
        return false;
    }
    // With the start time: the file outlives the client when the machine is restarted, and its
    // number is some other program's then.
    WritePidFile(pidFile.c_str(), VEXACReadPidFile(pidFile.c_str()));
    return true;
}

void ReadLease(const char* file, const char* key, char (&value)[TAVI_NET_ADDRESS_SIZE]) {
    if (VEXACFileGetKeyValue(file, key, value, sizeof value) <= 0) {
        throw Failure{VEXAC_ERR_NOT_FOUND};
    }
}

void GetLease(TAVINetCard& card) {
    if (!RunClient(card.interface)) {
        throw Failure{VEXAC_ERR_NOT_FOUND};
    }
    const std::string lease = FileOf(card.interface, ".info");
    ReadLease(lease.c_str(), "IPADDR", card.address);
    ReadLease(lease.c_str(), "NETMASK", card.netmask);
}

}  // namespace

void tavisdk::StopDhcpClient(const char* interface) {
    if (ClientRuns(interface)) {
        // Told to end, it would remove the pid file later, which may be its successor's then.
        VEXACProcSignalByPidFile(PidFileOf(interface).c_str(), SIGKILL);
    }
    VEXACSysUnlink(PidFileOf(interface).c_str());
}

int TAVIIGetDHCPTestNetInfo(TAVINetCard* card) {
    return Guarded(-1, [&] {
        RequireAll(card);
        FindInterface(card->interface);
        card->isStatic = 0;
        card->address[0] = card->netmask[0] = '\0';
        StopDhcpClient(card->interface);
        try {
            GetLease(*card);
        } catch (...) {
            StopDhcpClient(card->interface);  // it would change the address one day
            card->address[0] = card->netmask[0] = '\0';
            throw;
        }
        return 0;
    });
}

int BlTAVILnxIsDHCP(const char* interface) {
    return Guarded(0, [&] {
        RequireAll(interface);
        return ClientRuns(interface) ? 1 : 0;
    });
}
