// SPDX-License-Identifier: MIT
// Leaving a network.
#include <signal.h>
#include <tavicore/file.h>
#include <tavicore/process.h>
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include <cerrno>
#include <string>

#include "base/sleep_out.h"
#include "common/log.h"
#include "wireless/rules/paths.h"
#include "wireless/rules/supplicant.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"
#include "wireless/system/shell.h"

namespace taviwireless::wireless {

namespace {

constexpr size_t kCommandSize = 128;

bool ReleaseAddress(const std::string& interface) {
    return TAVI_RUN(
               Command(kCommandSize, {"/sbin/iwconfig ", Argument{interface}, " essid off"})) &&
           TAVI_RUN(Command(kCommandSize,
                            {"/sbin/ifconfig ", Argument{interface}, " 0.0.0.0 > /dev/null 2>&1"}));
}

int LeaveAdhoc(const std::string& interface) {
    if (VEXANetIfDown(interface.c_str()) == 0) {
        TAVI_LOG_ERROR("Failed to deactivate network interface [%s].", interface.c_str());
        return -1;
    }
    return TAVIWirelessOpmodeSet(WIRELESS_OPMODE_MANAGED);
}

bool StopSupplicant() {
    if (VEXACFileExist(kSupplicantPidFile) &&
        !TAVI_RUN(Command(kCommandSize, {kTerminateSupplicant}))) {
        return false;
    }
    VEXACSysUnlink(kSupplicantConf);
    return true;
}

// Compatible with earlier releases: the process of the number in the file is killed without a look
// at what it is, since VEXACReadPidFile gives no number that is another process's by now; and one
// that may not be killed is waited for without end.
void StopDhcpClient(const std::string& interface) {
    const std::string pidFile = kDhcpClientPrefix + interface + ".pid";
    pid_t pid;
    while ((pid = VEXACReadPidFile(pidFile.c_str())) > 0) {
        if (kill(pid, SIGKILL) == 0 || errno == ESRCH) {
            break;
        }
        TAVI_LOG_ERROR("dhcpcd pid[%d] still exists, wait 1 second", pid);
        SleepOut(1);
    }
    if (pid >= 0) {
        VEXACSysUnlink(pidFile.c_str());
    }
}

// Compatible with earlier releases: where the resolver's file was a link, the copy takes the place
// of the link.
bool RestoreResolver() {
    if (VEXACFileExist(kResolverBackup) && VEXACSysRename(kResolverBackup, kResolver) < 0) {
        TAVI_LOG_ERROR("Failed to rename '%s'", kResolverBackup);
        return false;
    }
    return true;
}

int Disconnect() {
    VEXACSysUnlink(kConnectingFlag);
    WirelessInfo info{};
    if (TAVIWirelessCurInfoGet(WIRELESS_INFO_CONN_STATUS, &info) != 0) {
        TAVI_LOG_ERROR("Failed to get status of dongle.");
        return -1;
    }
    const int status = info.value;
    if (status != WIRELESS_STATUS_NO_ADAPTER && status != WIRELESS_STATUS_CONNECTED &&
        status != WIRELESS_STATUS_ADHOC) {
        return 0;
    }
    VEXACSysUnlink(kCurrentConnection);
    const std::string interface = WirelessInterface();
    if (interface.empty()) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    if (status != WIRELESS_STATUS_NO_ADAPTER && !ReleaseAddress(interface)) {
        return -1;
    }
    if (status == WIRELESS_STATUS_ADHOC) {
        return LeaveAdhoc(interface);
    }
    if (!StopSupplicant()) {
        return -1;
    }
    StopDhcpClient(interface);
    return RestoreResolver() ? 0 : -1;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessNetworkDisconnect_core() {
    return TAVI_GUARDED(-1, taviwireless::wireless::Disconnect);
}
