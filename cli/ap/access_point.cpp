// SPDX-License-Identifier: MIT
#include "cli/ap/access_point.h"

#include <sys/statvfs.h>
#include <tavicore/keyvalue.h>
#include <tavicore/section.h>
#include <tavisdk/network.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "base/file_name.h"
#include "cli/ap/country.h"
#include "cli/ap/dry_run.h"
#include "cli/ap/failure_reason.h"
#include "cli/ap/hostapd.h"
#include "cli/ap/setting_words.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "wireless/rules/ap_settings.h"
#include "wireless/rules/paths.h"
#include "wireless/system/ap_store.h"
#include "wireless/system/bridge.h"
#include "wireless/system/files.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

using wireless::kAPSettings;

// Returns the settings of the plugged adapter, stored or default; nothing where no adapter is
// named, or where the user may not read the store. A store that cannot be read for another reason
// is a failure: what it holds may be what protects a network.
std::optional<WirelessAPSettings> FindSettings() {
    char section[sizeof WirelessAPSettings::name];
    const bool mayRead = access(kAPSettings, R_OK) == 0 || errno != EACCES;
    if (!mayRead || access(wireless::kAdapterInfo, R_OK) != 0 ||
        TAVIWirelessApConfigSecNameGet(section, sizeof section) != 1 || section[0] == '\0') {
        return std::nullopt;
    }
    WirelessAPSettings settings{};
    const int found = TAVIWirelessGetAPConfig(section, &settings);
    if (found < 0) {
        throw CommandError(kFailure, std::string("cannot read the settings in ") + kAPSettings);
    }
    if (found == 0) {
        // Without a section the guests' part is empty; stored like that, it would take down the
        // barriers that are up by default.
        wireless::VisitGuestNetwork(wireless::DefaultSetter(), settings);
    }
    return settings;
}

void RequireStored(bool isDone) {
    if (!isDone) {
        throw CommandError(kFailure, std::string("cannot store the settings in ") + kAPSettings +
                                         "; the system log tells why");
    }
}

// Stores whether the access point is on, and changes nothing else in the file.
void StoreEnabled(const WirelessAPSettings& settings, const char* yesOrNo) {
    RequireStored(VEXACFileSetSectionValue(kAPSettings, settings.name, "enable", yesOrNo,
                                           wireless::kSectionLine) == 0);
}

// Settings with which an access point may be served; throws when there are none.
WirelessAPSettings SettingsToServe() {
    WirelessAPSettings settings = ReadAPSettings();
    if (!AreStored(settings)) {
        throw CommandError(kFailure, "no settings are stored for the adapter " +
                                         Printable(settings.name) +
                                         "; taviwireless ap set stores them, and --open serves a "
                                         "network that everybody can join");
    }
    if (SecurityWord(MainNetwork(settings.ap)).empty()) {
        throw CommandError(kFailure,
                           "the stored security is none that is known here; set security");
    }
    if (const std::string reason = wireless::WhyNoBridge(settings.ap.bridge); !reason.empty()) {
        throw CommandError(kFailure, "bridge " + reason);
    }
    return settings;
}

bool HasChannels() {
    const wireless::Pipe lines(
        wireless::Command(128, {"iwlist ", TAVIWirelessAPInterfaceGet(), " active_channel"}));
    return lines && fgetc(lines.get()) != EOF;
}

bool HasProgram(const char* name) {
    return wireless::Pipe(wireless::Command(128, {"command -v ", name, " > /dev/null"})).Close() ==
           0;
}

// The library says only that it failed; these are what commonly stands behind that, and then what
// was written on standard error.
std::string CauseOfFailure(const std::string& errors) {
    struct statvfs disk {};
    if (access("/etc", W_OK) != 0) {
        return std::string("/etc cannot be written: ") + strerror(errno);
    }
    if (statvfs("/etc", &disk) == 0 && disk.f_bavail == 0) {
        return "there is no space left for files in /etc";
    }
    if (!HasProgram("iwlist")) {
        return "there is no program iwlist to ask for channels; install it";
    }
    if (!HasChannels()) {
        return "the adapter offers no channel; is its radio switched off? (rfkill list)";
    }
    const std::string reason = ReasonIn(errors);
    return reason.empty() ? "the system log tells why, and --verbose shows it" : reason;
}

std::string AddressOf(const char* interface) {
    TAVINetIFInfo info{};
    return TAVINetIFGetInfo(interface, &info) == 1 ? info.address : "";
}

// A file by which the access point would come back: the library goes on when it cannot change it.
// Empty when there is none.
std::string FileOfTheAccessPoint() {
    const char* interface = TAVIWirelessAPInterfaceGet();
    const std::string info = wireless::HostapdInfo(interface);
    const std::string file = wireless::InterfaceFile(interface);
    char bridge[TAVI_NET_IF_NAME_SIZE];
    if (!wireless::IsMissing(info.c_str())) {
        return info;
    }
    return VEXACFileGetKeyValue(file.c_str(), "BRIDGE", bridge, sizeof bridge) > 0 ? file : "";
}

void SwitchOnAsStored() {
    const ErrorKeeper errors;
    if (TAVIWirelessAPEnable() != 1) {
        throw CommandError(kFailure, "the access point could not be switched on: " +
                                         CauseOfFailure(errors.Text()));
    }
}

bool IsOffAlready() {
    const auto settings = FindSettings();
    return settings && settings->enabled == 0 && FileOfTheAccessPoint().empty() &&
           TAVIWirelessOpmodeGet() != WIRELESS_OPMODE_MASTER &&
           !ServesHostapd(TAVIWirelessAPInterfaceGet());
}

}  // namespace

// An open network says how it is protected, too.
bool AreStored(const WirelessAPSettings& settings) {
    char kind[16];
    return VEXACFileGetSectionValue(kAPSettings, settings.name, "encryption", kind, sizeof kind) ==
           0;
}

APStatus LookAtAP() {
    APStatus status{};
    status.isSupported = TAVIWirelessAPIsSupported() == 1;
    status.isConnecting = TAVIWirelessAPIsConnecting() == 1;
    status.isOn = TAVIWirelessOpmodeGet() == WIRELESS_OPMODE_MASTER;
    status.settings = FindSettings();
    if (status.settings) {
        status.bridgeAddress = AddressOf(status.settings->ap.bridge);
    }
    return status;
}

WirelessAPSettings ReadAPSettings() {
    const auto settings = FindSettings();
    if (!settings) {
        throw CommandError(kFailure, std::string("there are no settings without an adapter: ") +
                                         wireless::kAdapterInfo +
                                         " does not name its product; plug one in");
    }
    return *settings;
}

void StoreAPSettings(WirelessAPSettings settings) {
    // The library does not read the guests' BSSID back, and would store an empty one.
    VEXACFileGetSectionValue(kAPSettings, settings.name, "bssid", settings.ap.guestBssid,
                             sizeof settings.ap.guestBssid);
    // Not by TAVIWirelessSetAPConfig, which would switch on what is off until a second call.
    RequireStored(wireless::SaveAPSettings(
        settings, wireless::FindAPSection(settings.name, __FILE_NAME__, __LINE__), __FILE_NAME__,
        __LINE__));
}

void StoreOpenNetwork() {
    WirelessAPSettings settings = ReadAPSettings();
    if (!AreStored(settings)) {
        StoreAPSettings(settings);  // the defaults
    } else if (settings.ap.security != WIRELESS_AP_OPEN) {
        throw CommandError(kUsage, "--open is for an open network, and security " +
                                       SecurityWord(MainNetwork(settings.ap)) +
                                       " is stored; leave it out, or set security=open");
    }
}

Switched SwitchAPOn(const std::optional<WirelessAPSettings>& changed) {
    if (TAVIWirelessAPIsConnecting() == 1) {
        // This is refused, but also removes the flag that an attempt may have left when it was
        // killed.
        TAVIWirelessAPEnable();
        throw CommandError(kBusy,
                           "an access point is being switched on already; if that was interrupted, "
                           "try again");
    }
    WirelessAPSettings settings = changed ? *changed : SettingsToServe();
    const bool wasOff = settings.enabled == 0;
    settings.enabled = 1;
    if (changed) {
        StoreAPSettings(settings);
    } else if (wasOff) {
        StoreEnabled(settings, "yes");
    }
    if (!wasOff && IsServed(settings.ap)) {
        return {true, ""};
    }
    const std::string remark = EnforceCountry();
    try {
        SwitchOnAsStored();
    } catch (const CommandError&) {
        if (wasOff) {
            TAVIWirelessAPDisable();  // of the last step, much may run already
            StoreEnabled(settings, "no");
        }
        throw;
    }
    return {false, remark};
}

std::vector<std::string> PlanAP() {
    const WirelessAPSettings settings = SettingsToServe();
    if (access(wireless::kNetworkScript, X_OK) != 0) {
        throw CommandError(kFailure,
                           std::string("there is no program ") + wireless::kNetworkScript);
    }
    return PlanOfEnabling(settings.ap);
}

bool SwitchAPOff() {
    if (IsOffAlready()) {
        return false;
    }
    if (TAVIWirelessAPDisable() != 1) {
        throw CommandError(kFailure,
                           "the access point could not be switched off; the system log tells why");
    }
    if (const std::string left = FileOfTheAccessPoint(); !left.empty()) {
        throw CommandError(kFailure,
                           "switched off, but not after a restart: cannot change " + left);
    }
    const auto settings = FindSettings();
    if (settings && settings->enabled != 0) {
        StoreEnabled(*settings, "no");
    }
    // Those of an adapter that was pulled out cannot be found; its network goes all the same.
    if (!settings && !wireless::IsMissing(wireless::kAdapterInfo)) {
        throw CommandError(kFailure,
                           std::string("switched off, but not after a restart: cannot read ") +
                               wireless::kAdapterInfo + " or " + kAPSettings);
    }
    return true;
}

}  // namespace taviwireless::cli
