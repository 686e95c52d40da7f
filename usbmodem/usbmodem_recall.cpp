// SPDX-License-Identifier: MIT
// A connection that another process dialled: what is known of it without asking the modem, and its
// end when the modem is gone.
#include <limits.h>
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/process.h>
#include <tavisdk/network.h>
#include <taviwireless/usbmodem.h>
#include <unistd.h>

#include "common/log.h"
#include "usbmodem/rules/paths.h"
#include "usbmodem/rules/status.h"

namespace taviwireless::usbmodem_lib {

namespace {

// The IMSI in the name of the log that is the process's standard error; empty when that is no
// dialler's log. What the kernel adds to the name of a deleted file is left out.
std::string IMSIOfDialler(pid_t dialler) {
    const std::string link = "/proc/" + std::to_string(dialler) + "/fd/2";
    char target[PATH_MAX];
    const ssize_t length = readlink(link.c_str(), target, sizeof target);
    const std::string log(target, length > 0 ? static_cast<size_t>(length) : 0);
    if (log.rfind(kDialLogPrefix, 0) != 0) {
        return "";
    }
    const std::string name = log.substr(sizeof kDialLogPrefix - 1);
    return name.substr(0, name.find_first_not_of("0123456789"));
}

bool HasDefaultRoute() {
    char gateway[TAVI_NET_ADDRESS_SIZE] = {};
    return TAVINetDefaultGatewayGet(gateway, sizeof gateway) == 0;
}

}  // namespace

int USBModem::RecallConnection() {
    const std::string pidFile = PidFilePath();
    if (VEXACProcAliveByPidFile(pidFile.c_str()) != 1) {
        return 0;
    }
    const std::string imsi = IMSIOfDialler(VEXACReadPidFile(pidFile.c_str()));
    if (imsi.empty()) {
        TAVI_LOG_ERROR("cannot tell which SIM the dialler of %s uses", GetDevId().c_str());
        return -1;
    }
    pidFile_ = pidFile;
    imsi_ = imsi;
    profilePath_ = ProfilePath(imsi);
    AssignConnectInfo();
    return 1;
}

int USBModem::EndConnection() {
    CloseFileDevice();  // nothing of what follows can be asked of the modem
    const std::string pidFile = PidFilePath();
    if (VEXACFileExist(pidFile.c_str()) != 1) {
        return VEXACErrGet() == VEXAC_ERR_NOT_FOUND ? 0 : -1;
    }
    const bool wasConnected = netStatus_ == NetStatus::kConnected;
    RecallConnection();
    if (profilePath_.empty() && !imsi_.empty()) {
        profilePath_ = ProfilePath(imsi_);
    }
    // As it was when it was dialled; of any other the profile is not read.
    simStatus_ = SimStatus::kReady;
    const int result = NetDisconnect();
    if (VEXACFileExist(pidFile.c_str()) != 1) {
        return result;
    }
    // The dialler has ended by itself; the route is still to be given back.
    VEXACSysUnlink(pidFile.c_str());
    bool ignored = false;
    if (GetProfileDefaultGW(ignored) != "true" || (!wasConnected && HasDefaultRoute())) {
        return 0;
    }
    return RestoreDefaultRoute();
}

}  // namespace taviwireless::usbmodem_lib
