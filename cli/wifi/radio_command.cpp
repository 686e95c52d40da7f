// SPDX-License-Identifier: MIT
// taviwireless wifi radio: the stored setting and the kernel's switch in one.
#include <tavicore/keyvalue.h>
#include <tavicore/section.h>

#include "cli/adapter/requirements.h"
#include "cli/adapter/rfkill.h"
#include "cli/wifi/station.h"
#include "cli/wifi/wifi_commands.h"
#include "cli/wifi/wifi_report.h"
#include "wireless/rules/paths.h"
#include "wireless/system/ap_store.h"

namespace taviwireless::cli {

namespace {

// The section of this adapter's settings. Throws when nobody knows which adapter it is.
std::string SectionOfTheAdapter() {
    char product[1024];
    if (VEXACFileGetKeyValue(wireless::kAdapterInfo, "PRODUCT", product, sizeof product) <= 0) {
        throw CommandError(kFailure, std::string(wireless::kAdapterInfo) +
                                         " does not name the adapter; unplug it and plug it in");
    }
    return product;
}

// Stores whether the radio may be used, with the other settings of this adapter.
void StoreRadio(const std::string& section, const char* mayBeUsed) {
    // Makes a store that is missing.
    wireless::FindAPSection(section.c_str(), __FILE_NAME__, __LINE__);
    if (VEXACFileSetSectionValue(wireless::kAPSettings, section.c_str(), "unblock", mayBeUsed,
                                 wireless::kSectionLine) != 0) {
        throw CommandError(kFailure, std::string("cannot store that in ") + wireless::kAPSettings +
                                         ", which may not be writable, or held by another program");
    }
}

void RequireNoAccessPoint() {
    if (TAVIWirelessConnStatusGet() == WIRELESS_STATUS_MASTER) {
        throw CommandError(kBusy, "the access point is on; taviwireless ap disable ends it");
    }
}

}  // namespace

void SwitchRadio(const Options& options) {
    RequireAdapter();
    const bool isOn = options.mode == "on";
    if (!isOn) {
        RequireNoAccessPoint();
        const std::string section = SectionOfTheAdapter();
        LeaveNetwork();
        StoreRadio(section, "no");
    } else if (TAVIWirelessCheckBlock() != 1) {  // where nothing is stored, it may be used
        StoreRadio(SectionOfTheAdapter(), "yes");
    }
    if (!SetRadioSwitch(isOn)) {
        throw CommandError(kFailure,
                           "the setting is stored, but the kernel does not let the radio "
                           "be switched " +
                               options.mode);
    }
    if (isOn && LookAtRadioSwitch() == RadioSwitch::kOffHard) {
        throw CommandError(kFailure, "a switch or a key of this machine keeps the radio off");
    }
    PrintOutcome(options, WifiInterface() + ": the radio is " + options.mode, [&] {
        Report report;
        report.document["interface"] = WifiInterface();
        report.document["radio"] = isOn;
        return report;
    });
}

}  // namespace taviwireless::cli
