// SPDX-License-Identifier: MIT
// Joining a network with wpa_supplicant.
#include <poll.h>
#include <sys/socket.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavisdk/service.h>
#include <taviwireless/wireless.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <sstream>
#include <string>

#include "base/sleep_out.h"
#include "base/trusted_file.h"
#include "common/log.h"
#include "wireless/rules/paths.h"
#include "wireless/rules/supplicant.h"
#include "wireless/system/files.h"
#include "wireless/system/flag_file.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"
#include "wireless/system/shell.h"
#include "wireless/system/supplicant_socket.h"

namespace taviwireless::wireless {

namespace {

constexpr char kSystemInfo[] = "/etc/taviinfo.conf";
constexpr mode_t kSupplicantMode = 0600;  // it holds the key
constexpr mode_t kRecordMode = 0644;
constexpr int kPolls = 15;  // a second each

// Writes what the supplicant is started with. False, with the reason in the log, when it cannot.
bool WriteSupplicantConf(const WirelessConf& conf) {
    const SupplicantConf rendered = RenderSupplicantConf(conf);
    if (rendered.holdsLineBreak) {
        TAVI_LOG_ERROR("The ESSID, key or user name holds a line break");
        return false;
    }
    const UniqueFile file = CreateAnew(kSupplicantConf, kSupplicantMode);
    if (!file) {
        TAVI_LOG_ERROR("Failed to open file[%s].", kSupplicantConf);
        return false;
    }
    if (rendered.isWepKeyLeftOut) {
        TAVI_LOG_ERROR("Wrong WEP Format.");
    }
    if (rendered.isAuthUnknown) {
        TAVI_LOG_ERROR("Failed to detect authentication/encryption type");
    }
    return WriteWhole(file, kSupplicantConf, rendered.text) && !rendered.isAuthUnknown;
}

bool StopSupplicant() {
    return TAVI_RUN(Command(128, {kTerminateSupplicant}));
}

// The output is dropped here as well, because the supplicant quotes a pass phrase that it rejects
// and not every shell knows "&>".
bool StartSupplicant(const std::string& interface) {
    const Command start(1024, {"/usr/sbin/wpa_supplicant -Dwext -i", Argument{interface}, " -c",
                               kSupplicantConf, " -B -P", kSupplicantPidFile, " &> /dev/null"});
    return TAVI_RUN_SILENTLY(start);
}

bool IsAssociated() {
    const Pipe status(Command(128, {"/usr/sbin/wpa_cli status | grep wpa_state"}));
    char state[32];
    return status && fscanf(status.get(), " wpa_state=%31s", state) == 1 &&
           strcmp(state, "COMPLETED") == 0;
}

// Waits a second, or until the supplicant tells that it is connected. Closes events once it has ended.
void AwaitConnection(UniqueFd& events) {
    using std::chrono::nanoseconds;
    using Clock = std::chrono::steady_clock;
    const auto end = Clock::now() + std::chrono::seconds(1);
    char text[2048] = "";
    for (nanoseconds left = std::chrono::seconds(1);
         left.count() > 0 && strstr(text, "EVENT-CONNECTED") == nullptr;
         left = end - Clock::now()) {
        pollfd event{events.Get(), POLLIN, 0};
        const auto seconds = std::chrono::floor<std::chrono::seconds>(left);
        const timespec limit{static_cast<time_t>(seconds.count()),
                             static_cast<long>((left - seconds).count())};
        if (ppoll(&event, 1, &limit, nullptr) == 0) {
            return;
        }
        const ssize_t size = recv(events.Get(), text, sizeof text - 1, MSG_DONTWAIT);
        if (size == 0 || (size < 0 && errno != EAGAIN)) {
            events.Close();
            SleepOut(1);
            return;
        }
        text[std::max<ssize_t>(size, 0)] = '\0';
    }
}

// The first second is always waited for: only then has the supplicant begun.
bool WaitForAssociation(const std::string& interface) {
    UniqueFd events;
    for (int i = 0; i < kPolls; ++i) {
        if (i > 0 && !events) {
            events = AttachToSupplicant(interface);
        }
        if (events) {
            AwaitConnection(events);
        } else {
            SleepOut(1);
        }
        if (IsAssociated()) {
            return true;
        }
    }
    TAVI_LOG_ERROR("Time out to connect AP, kill wpa_supplicant.");
    StopSupplicant();
    return false;
}

// Notes the network for TAVIWirelessStatusGet. What strangers put in the place of the file, a
// folder for example, is removed.
bool RecordConnection(const WirelessNetwork& network) {
    struct stat status {};
    if (lstat(kCurrentConnection, &status) == 0 && !IsTrustedOwner(status.st_uid)) {
        RemoveAll(kCurrentConnection);
    }
    const UniqueFile file = CreateAnew(kCurrentConnection, kRecordMode);
    char bssid[18];
    std::ostringstream record;
    record << network.essid << '\n'
           << network.protocol << '\n'
           << network.auth << '\n'
           << network.encrypt << '\n'
           << TAVIWirelessBssidStringGet(network.bssid, bssid, sizeof bssid) << '\n';
    return file && WriteWhole(file, kCurrentConnection, record.str());
}

int Connect(const std::string& interface, const WirelessConf* conf) {
    if (interface.empty() || conf == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    if (conf->network.opmode == WIRELESS_OPMODE_ADHOC) {
        return TAVIWirelessAdhocCreate(conf);
    }
    if (!WriteSupplicantConf(*conf)) {
        TAVI_LOG_ERROR("Failed to set [%s]", kSupplicantConf);
        return -1;
    }
    if (VEXACFileExist(kSupplicantPidFile) && !StopSupplicant()) {
        return -1;
    }
    if (!StartSupplicant(interface) || !WaitForAssociation(interface)) {
        return -1;
    }
    if (!RecordConnection(conf->network)) {
        TAVI_LOG_ERROR("Failed to record this connection.");
        return -1;
    }
    return 0;
}

void RestartMediaService(const std::string& interface) {
    if (VEXACFileCheckKeyValue(kSystemInfo, "runmediaservice", "yes", 0) &&
        VEXACFileCheckKeyValue(kSystemInfo, "network_mediaservice", interface.c_str(), 0)) {
        TAVIMediaService(TAVI_MEDIA_SERVICE_RESTART);
    }
}

// Keeps a copy, also where the resolver's file is a link to one that another program writes.
// Compatible with earlier releases: disconnecting puts the copy in the place of the link.
void KeepResolver() {
    if (VEXACFileExist(kResolver)) {
        TAVI_RUN(Command(128, {"/bin/cp ", kResolver, " ", kResolverBackup}));
    }
}

int ConnectOnce(const WirelessConf* conf) {
    const FlagFile flag(kConnectingFlag);
    if (TAVIWirelessAdapterNum() < 1) {
        TAVI_LOG_ERROR("There is no wireless USB adapter plugged");
        return -1;
    }
    // A radio that is blocked, or whose setting cannot be read, leaves nothing to do.
    if (TAVIWirelessCheckBlock() != 1) {
        return 0;
    }
    if (!flag.Raise()) {
        TAVI_LOG_ERROR("Another connection construction is going");
        return -1;
    }
    const std::string interface = WirelessInterface();
    if (Connect(interface, conf) != 0) {
        TAVI_LOG_ERROR("Failed to connect network.");
        return -1;
    }
    RestartMediaService(interface);
    KeepResolver();
    return 0;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessNetworkConnect(WirelessConf* conf) {
    return TAVI_GUARDED(-1, [conf] { return taviwireless::wireless::ConnectOnce(conf); });
}
