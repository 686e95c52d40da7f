#include "cli/ap/access.h"

#include <sys/statvfs.h>
#include <tavicore/section.h>
#include <tavisdk/network.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "cli/commands.h"
#include "cli/wifi/access.h"
#include "wireless/ap_settings.h"
#include "wireless/paths.h"

namespace taviwireless::cli {

namespace {

using wireless::kAPSettings;

// Gives what it visits its default.
struct Defaults {
    template <typename Key>
    void Number(const Key&, int32_t& field, int32_t value) const {
        field = value;
    }
    template <typename Key, size_t Size>
    void Text(const Key&, char (&field)[Size], const std::string& value) const {
        SetField(field, value);
    }
    template <size_t Size>
    void WriteOnly(const char*, const char (&)[Size]) const {}
};

std::optional<WirelessAPSettings> FindSettings() {
    char section[sizeof WirelessAPSettings::name];
    const bool mayRead = access(kAPSettings, R_OK) == 0 || errno == ENOENT;
    if (!mayRead || access(wireless::kAdapterInfo, R_OK) != 0 ||
        TAVIWirelessApConfigSecNameGet(section, sizeof section) != 1) {
        return std::nullopt;
    }
    WirelessAPSettings settings{};
    if (TAVIWirelessGetAPConfig(section, &settings) <= 0) {
        // Without a section the guests' part is empty; stored like that, it would take down the
        // barriers that are up by default.
        const Defaults defaults;
        wireless::VisitGuestNetwork(defaults, settings);
    }
    return settings;
}

void Store(const WirelessAPSettings& settings) {
    if (TAVIWirelessSetAPConfig(&settings) != 1) {
        throw CommandError(kFailure, std::string("cannot store the settings in ") + kAPSettings +
                                         "; the system log tells why");
    }
}

bool HasChannels() {
    const std::string command =
        std::string("iwlist ") + TAVIWirelessAPInterfaceGet() + " active_channel";
    const std::unique_ptr<FILE, decltype(&pclose)> lines(popen(command.c_str(), "r"), pclose);
    return lines && fgetc(lines.get()) != EOF;
}

// The library says only that it failed; these are what commonly stands behind that.
std::string CauseOfFailure() {
    struct statvfs disk {};
    if (access("/etc", W_OK) != 0) {
        return std::string("/etc cannot be written: ") + strerror(errno);
    }
    if (statvfs("/etc", &disk) == 0 && disk.f_bavail == 0) {
        return "there is no space left for files in /etc";
    }
    if (system("command -v iwlist >/dev/null") != 0) {
        return "there is no program iwlist to ask for channels; install it";
    }
    if (!HasChannels()) {
        return "the adapter offers no channel; is its radio switched off? (rfkill list)";
    }
    return "the system log tells why, and --verbose shows it";
}

std::string AddressOf(const char* interface) {
    TAVINetIFInfo info{};
    return TAVINetIFGetInfo(interface, &info) == 1 ? info.address : "";
}

}  // namespace

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
        throw CommandError(kFailure,
                           "there are no settings without an adapter: /tmp/wireless.info does not "
                           "name its product; plug one in");
    }
    return *settings;
}

void StoreAPSettings(WirelessAPSettings settings) {
    // The library does not read it back, and would store none.
    VEXACFileGetSectionValue(kAPSettings, settings.name, "bssid", settings.ap.guestBssid,
                             sizeof settings.ap.guestBssid);
    const int32_t enabled = settings.enabled;
    settings.enabled = 1;  // of an access point that is off nothing but that is stored
    Store(settings);
    if (enabled == 0) {
        settings.enabled = 0;
        Store(settings);
    }
}

void SwitchAPOn() {
    if (TAVIWirelessAPIsConnecting() == 1) {
        // Refused, which also removes what is left of an attempt that was killed.
        TAVIWirelessAPEnable();
        throw CommandError(kBusy,
                           "an access point is being switched on already; if that was interrupted, "
                           "try again");
    }
    WirelessAPSettings settings = ReadAPSettings();
    const bool wasOff = settings.enabled == 0;
    if (wasOff) {
        settings.enabled = 1;
        StoreAPSettings(settings);
    }
    if (TAVIWirelessAPEnable() != 1) {
        if (wasOff) {
            settings.enabled = 0;
            Store(settings);
        }
        throw CommandError(kFailure,
                           "the access point could not be switched on: " + CauseOfFailure());
    }
}

void SwitchAPOff() {
    if (TAVIWirelessAPDisable() != 1) {
        throw CommandError(kFailure,
                           "the access point could not be switched off; the system log tells why");
    }
    // Those of an adapter that was pulled out cannot be found; its network goes all the same.
    if (auto settings = FindSettings()) {
        settings->enabled = 0;
        Store(*settings);
    }
}

}  // namespace taviwireless::cli
