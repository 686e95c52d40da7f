// SPDX-License-Identifier: MIT
// Writing what hostapd is started with.
#include <signal.h>
#include <tavicore/file.h>
#include <tavicore/process.h>
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include "base/interface_name.h"
#include "common/log.h"
#include "wireless/rules/hostapd_conf.h"
#include "wireless/rules/paths.h"
#include "wireless/system/files.h"
#include "wireless/system/grep_pattern.h"
#include "wireless/system/guarded.h"
#include "wireless/system/guest_network.h"
#include "wireless/system/shell.h"

namespace taviwireless::wireless {

namespace {

constexpr mode_t kMode = 0600;  // they hold keys
constexpr size_t kCommandSize = 1024;

// Ends the first process that has both names in its arguments. Where ps lists arguments and no
// hostapd runs, that is the shell of this very command, to which the signal does no harm.
void StopHostapd(const std::string& interface) {
    const Pipe pids(Command(
        kCommandSize,
        {"ps | grep hostapd | grep ", Argument{GrepPattern(interface)}, " | awk {'print $1'}"}));
    int pid = 0;
    const bool isRunning = pids && fscanf(pids.get(), " %d", &pid) == 1 && pid > 0;
    if (!pids || (isRunning && kill(pid, SIGTERM) != 0)) {
        TAVI_LOG_ERROR("Failed to kill hostapd");
    }
}

void TakeDown(const char* interface) {
    if (TAVINetIsIFUp(interface) == 1 && VEXANetIfDown(interface) == 0) {
        TAVI_LOG_ERROR("Failed to deactivate network interface [%s].", interface);
    }
}

bool MakeFolder() {
    if (VEXACExec("/bin/mkdir", "-p", kHostapdFolder, nullptr) != 0) {
        TAVI_LOG_ERROR("Failed to mkdir %s", kHostapdFolder);
        return false;
    }
    return true;
}

bool Write(const std::string& path, const HostapdConf& conf) {
    const UniqueFile file = CreateAnew(path.c_str(), kMode);
    return file && WriteWhole(file, path.c_str(), conf.Text());
}

bool WriteForGuests(const std::string& path, const HostapdConf& conf) {
    if (!Write(path, conf)) {
        TAVI_LOG_ERROR("Failed to open file [%s]", path.c_str());
        TAVI_LOG_ERROR("Failed to set hostapd.conf for Guest Network");
        return false;
    }
    return true;
}

HostapdConf RenderGuestInfo(const WirelessAPConf& conf) {
    HostapdConf info;
    info.Add("enable", conf.guestEnabled != 0 ? "yes" : "no");
    return info;
}

int WriteAll(const char* interface, const WirelessAPConf* conf) {
    if (interface == nullptr || conf == nullptr || !IsInterfaceName(interface)) {
        TAVI_LOG_ERROR("Bad parameter.");
        return 0;
    }
    const bool offersGuests = OffersGuestNetwork();
    const HostapdConf host = RenderHostConf(interface, *conf);
    const HostapdConf guest = RenderGuestConf(*conf);
    if (host.HoldsLineBreak() || (offersGuests && guest.HoldsLineBreak())) {
        TAVI_LOG_ERROR("A name, key or address of the access point holds a line break");
        return 0;
    }
    StopHostapd(interface);
    TakeDown(interface);
    const std::string hostFile = HostapdHostConf(interface);
    VEXACSysUnlink(hostFile.c_str());
    if (!MakeFolder() || !Write(hostFile, host)) {
        return 0;
    }
    if (offersGuests && (!WriteForGuests(HostapdGuestInfo(interface), RenderGuestInfo(*conf)) ||
                         !WriteForGuests(HostapdGuestConf(interface), guest))) {
        return 0;
    }
    return 1;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessSetHostAPConf(const char* interface, const WirelessAPConf* conf) {
    return TAVI_GUARDED(0, [=] { return taviwireless::wireless::WriteAll(interface, conf); });
}
