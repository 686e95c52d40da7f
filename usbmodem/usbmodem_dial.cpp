// SPDX-License-Identifier: MIT
// Dialling and hanging up: the dialler's settings, its process and its files.
#include <fcntl.h>
#include <signal.h>
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavicore/process.h>
#include <taviwireless/usbmodem.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "base/close_all_from.h"
#include "base/unique_pipe.h"
#include "common/log.h"
#include "usbmodem/profile_value.h"
#include "usbmodem/rules/paths.h"
#include "usbmodem/rules/profile.h"
#include "usbmodem/rules/status.h"
#include "usbmodem/state_files.h"

namespace taviwireless::usbmodem_lib {

namespace {

constexpr char kDialler[] = "/usr/tavi/bin/wvdial";
constexpr char kInit[] = "Init1=ATZ";
constexpr char kBaud[] = "Baud=460800";

std::string OrElse(const std::string& value, const char* standard) {
    return value.empty() ? standard : value;
}

// In the child of BackgroundExec: becomes the dialler, or aborts. Closing hasPidFile tells the
// parent that the pid file is written. Without one nobody could end the dialler, so there is none
// then.
[[noreturn]] void BecomeDialler(char* const arguments[], const char* pidFile, const char* logFile,
                                int hasPidFile) {
    const int log = open(logFile, O_RDWR | O_CREAT, kStateFileMode);
    if (VEXACProcPidFileCreate(pidFile) < 0) {
        _exit(EXIT_FAILURE);
    }
    close(hasPidFile);
    VEXACFileCloseLock(dup2(log, STDERR_FILENO));
    // The caller's descriptors are not the dialler's: the AT channel must close with its owner, and
    // a reader of the caller's output must see its end.
    const int nothing = open("/dev/null", O_RDWR);
    dup2(nothing, STDIN_FILENO);
    dup2(nothing, STDOUT_FILENO);
    CloseAllFrom(STDERR_FILENO + 1);
    setsid();
    execv(arguments[0], arguments);
    dprintf(STDERR_FILENO, "cannot run %s: %s\n", arguments[0], strerror(errno));
    abort();
}

}  // namespace

// Everything of a profile that dialling needs, one dialler argument each.
struct USBModem::DialSettings {
    std::string init;
    std::string modem;
    std::string phone;
    std::string username;
    std::string password;
    std::string defaultGateway;  // the profile's "default_gw"
    std::string logFile;
};

std::string USBModem::PidFilePath() const {
    return kPidFilePrefix + std::to_string(interfaceId_);
}

int USBModem::NetConnect() {
    newPlugIn_ = false;
    DialSettings settings;
    int result = -1;
    if (PrepareToDial(settings)) {
        busy_ = true;  // until UpdateNetStatus sees the link settle
        result =
            BackgroundExec(kDialler, kInit, settings.init, kBaud, settings.modem, settings.phone,
                           settings.username, settings.password, pidFile_, settings.logFile);
    }
    if (result < 0) {
        ++connectFailedAttempts_;
    }
    return result;
}

// One error flag is shared by all queries, so that what one of them could not read stops the
// dialling.
bool USBModem::PrepareToDial(DialSettings& settings) {
    bool err = false;
    if (UpdateSIMStatus() != 1) {
        TAVI_LOG_ERROR("Net connect failed: PIN is not ready");
        return false;
    }
    if (!IsNetDisconnected(err)) {
        TAVI_LOG_ERROR("%s is not disconnected", GetDevId().c_str());
        return false;
    }
    if (connectNode_.empty()) {
        TAVI_LOG_ERROR("error on setting connect device node while connection");
        return false;
    }
    // Compatible with earlier releases: only a result above 0 stops, which InitProfile never has. A
    // profile that cannot be made shows when it is read.
    if (InitProfile() > 0) {
        TAVI_LOG_ERROR("Net connect error: profile init failed");
        return false;
    }
    ReadDialSettings(settings, err);
    if (SetDefaultRoute(settings.defaultGateway) != 0) {
        TAVI_LOG_ERROR("Net connect error: failed on set default route");
        return false;
    }
    if (err) {
        TAVI_LOG_ERROR("Net connect error: failed on get value from profile");
        return false;
    }
    InsertPPPModules();
    pidFile_ = PidFilePath();
    if (settings.defaultGateway == "true" && BackupDefaultRoute() != 0) {
        TAVI_LOG_ERROR("Backup default route failed");
        return false;
    }
    settings.logFile = DialLogPath(GetIMSI(err));
    if (err) {
        TAVI_LOG_ERROR("Error on getting IMSI for log file");
        return false;
    }
    if (!MakeEmptyFile(settings.logFile)) {
        TAVI_LOG_ERROR("Error on init logfile %s, but continue", settings.logFile.c_str());
    }
    if (busy_) {
        TAVI_LOG_ERROR("error on connection establish when busy");
        return false;
    }
    return true;
}

void USBModem::ReadDialSettings(DialSettings& settings, bool& err) {
    // A file may hold what is refused today, and a modem may answer anything.
    const auto checked = [&err](const char* key, const std::string& value) {
        err = !IsProfileValue(key, value) || err;
        return value;
    };
    std::string apn = GetProfileAPN(err);
    if (apn.empty()) {
        apn = GetDefaultAPN(err);
    }
    settings.init = "Init2=AT+CGDCONT=1,\"ip\",\"" + checked(profile::kAPN, apn) + '"';
    settings.modem = "Modem=" + connectNode_;
    settings.phone =
        "Phone=" + checked(profile::kNumber, OrElse(GetProfilePhone(err), profile::kDefaultNumber));
    settings.username = "Username=" + checked(profile::kUser, OrElse(GetProfileUsername(err),
                                                                     profile::kDefaultUser));
    settings.password = "Password=" + checked(profile::kPassword, OrElse(GetProfilePassword(err),
                                                                         profile::kDefaultUser));
    settings.defaultGateway = GetProfileDefaultGW(err);
}

int USBModem::BackgroundExec(const std::string& program, const std::string& init1,
                             const std::string& init2, const std::string& baud,
                             const std::string& modem, const std::string& phone,
                             const std::string& username, const std::string& password,
                             const std::string& pidFile, const std::string& logFile) {
    const std::string arguments[] = {program,
                                     init1,
                                     init2,
                                     baud,
                                     phone,  // before the modem: this order is the dialler's usual
                                     modem,
                                     username,
                                     password,
                                     "Dial Attempts=1",
                                     "Auto Reconnect=1",
                                     "Stupid Mode=1"};
    std::vector<char*> pointers;
    for (const std::string& argument : arguments) {
        pointers.push_back(const_cast<char*>(argument.c_str()));
    }
    pointers.push_back(nullptr);

    UniquePipe pidFileIsWritten;
    const pid_t child = pidFileIsWritten ? VEXACProcForkChildNoWait() : -1;
    if (child == 0) {
        BecomeDialler(pointers.data(), pidFile.c_str(), logFile.c_str(),
                      pidFileIsWritten.writeEnd.Get());
    }
    // Whoever looks at the link from now on finds the pid file.
    pidFileIsWritten.ReadByte();
    if (child < 0) {
        VEXACErrSet(VEXAC_ERR_FORK_FAILED);
        return -1;
    }
    return 1;
}

int USBModem::NetDisconnect() {
    newPlugIn_ = false;
    pidFile_ = PidFilePath();
    if (VEXACFileExist(pidFile_.c_str()) != 1) {
        TAVI_LOG_ERROR("failed on disconnect, cannot find pidfile %s", pidFile_.c_str());
        return -1;
    }
    if (VEXACProcSignalByPidFile(pidFile_.c_str(), SIGTERM) != 0) {
        TAVI_LOG_ERROR("failed on disconnect with sending signal %d with pidfile %s", SIGTERM,
                       pidFile_.c_str());
        return -1;
    }
    VEXACSysUnlink(pidFile_.c_str());
    pidFile_.clear();
    netIFName_.clear();
    netLocalIP_.clear();
    bool err = false;
    if (GetProfileDefaultGW(err) != "true") {
        return 0;  // also when it could not be read
    }
    if (err) {
        TAVI_LOG_ERROR("Net connect error: failed on get value(defaultroute) from profile");
        return -1;
    }
    if (RestoreDefaultRoute() != 0) {
        TAVI_LOG_ERROR("routing table is losing default gateway");
        return -1;
    }
    return 0;
}

int USBModem::InsertPPPModules() {
    int result = 0;
    for (const char* module : {"slhc", "ppp_generic", "ppp_async"}) {
        const std::string command =
            std::string("/sbin/insmod /lib/modules/") + module + ".ko 1>/dev/null 2>&1";
        result = system(command.c_str());
    }
    return result;
}

int USBModem::TestConfToFile() {
    const std::string path = kStateFilePrefix + std::to_string(interfaceId_);
    VEXACFileTouch(path.c_str());
    const auto set = [&path](const char* key, const std::string& value) {
        VEXACFileSetKeyValue(path.c_str(), key, value.c_str(), nullptr);
    };
    pidFile_ = PidFilePath();
    bool err = false;
    set("InterfaceID", std::to_string(static_cast<int>(interfaceId_)));
    set("ConnectUSB", connectNode_);
    set("QuaryUSB", queryNode_);
    set("PINVerified", std::to_string(static_cast<int>(simStatus_)));
    set("isConnected", GetNetStatus(err));
    set("PidFile", pidFile_);
    return 0;
}

}  // namespace taviwireless::usbmodem_lib
