// SPDX-License-Identifier: MIT
// The default route: whether the link may take it, and giving it back.
#include <tavicore/file.h>
#include <tavisdk/network.h>
#include <taviwireless/usbmodem.h>

#include <cerrno>
#include <cstring>
#include <optional>

#include "base/trusted_file.h"
#include "common/log.h"
#include "usbmodem/rules/paths.h"
#include "usbmodem/state_files.h"

namespace taviwireless::usbmodem_lib {

namespace {

constexpr char kPeerOptions[] = "/etc/ppp/peers/wvdial";
constexpr char kNoDefaultRoute[] = "nodefaultroute";
constexpr char kBackup[] = "/etc/ppp/usbmodem_backup_gw";

// The first line of the backup that counts: the other part of the system goes first.
std::string SavedGateway() {
    std::optional<std::string> text = ReadTrusted(kOtherGatewayBackup);
    if (!text) {
        if (errno != ENOENT) {
            TAVI_LOG_ERROR("%s does not count: %s", kOtherGatewayBackup, strerror(errno));
        }
        text = ReadTrusted(kBackup);
    }
    return text ? text->substr(0, text->find('\n')) : "";
}

int SetGateway(const std::string& gateway) {
    const int result = TAVINetDefaultGatewaySet(gateway.c_str());
    if (result != 0) {
        TAVI_LOG_ERROR("Failed to set default gateway (%s), try default gateway config",
                       gateway.c_str());
    }
    return result;
}

}  // namespace

int USBModem::SetDefaultRoute(const std::string& flag) {
    if (flag.empty()) {
        TAVI_LOG_ERROR("error on input args, should not be zero size");
        return -1;
    }
    if (VEXACFileRemoveLine(kPeerOptions, kNoDefaultRoute) < 0) {
        TAVI_LOG_ERROR("error on remove line nodefaultroute in /etc/ppp/peers/wvdial");
        return -1;
    }
    if (flag == "true") {
        return 0;
    }
    if (VEXACFileAddLine(kPeerOptions, nullptr, kNoDefaultRoute, 1) != 1) {
        TAVI_LOG_ERROR("error on add line nodefaultroute to /etc/ppp/peers/wvdial");
        return -1;
    }
    return 0;
}

int USBModem::BackupDefaultRoute() {
    char gateway[TAVI_NET_ADDRESS_SIZE] = {};
    if (TAVINetDefaultGatewayGet(gateway, sizeof gateway) != 0) {
        TAVI_LOG_ERROR("Get default gateway failed");
        return -1;
    }
    if (!MakeEmptyFile(kBackup)) {
        TAVI_LOG_ERROR("Failed to generate gateway backup file (%s), ", kBackup);
        return -1;
    }
    if (VEXACFileAddLine(kBackup, nullptr, gateway, 512) != 1) {
        TAVI_LOG_ERROR("Failed to store default gateway (%s) to file (%s)", gateway, kBackup);
    }
    return 0;  // also then: a connection without a way back is better than none
}

int USBModem::RestoreDefaultRoute() {
    if (VEXACFileExist(kBackup) != 1) {
        TAVI_LOG_ERROR("Backup gateway is not existed (%s)", kBackup);
        return -1;
    }
    const std::string saved = SavedGateway();
    if (!BlVEXAIsIpAddr(saved.c_str())) {
        TAVI_LOG_ERROR("File format error (%s)", saved.c_str());
        return -1;
    }
    int result = SetGateway(saved);
    if (result != 0) {
        char configured[TAVI_NET_ADDRESS_SIZE] = {};
        if (TAVINetDefaultGatewayGetConf(configured, sizeof configured) != 0) {
            TAVI_LOG_ERROR("Get default gateway failed");
        } else {
            result = SetGateway(configured);
        }
    }
    return result;
}

}  // namespace taviwireless::usbmodem_lib
