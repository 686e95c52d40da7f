#include "cli/adapter/requirements.h"

#include <taviwireless/wireless.h>
#include <unistd.h>

#include "cli/command_error.h"
#include "wireless/rules/paths.h"
#include "wireless/system/flag_file.h"
#include "wireless/system/interface.h"

namespace taviwireless::cli {

std::string WifiInterface() {
    return wireless::WirelessInterface();
}

void RequireWifiSupport() {
    if (TAVIWirelessIsSupported() == 0) {
        throw CommandError(kFailure, std::string("this model does not support Wi-Fi: ") +
                                         wireless::kModelInfo +
                                         " does not say support_wireless=yes");
    }
}

void RequireWifiSettings() {
    RequireWifiSupport();
    if (geteuid() != 0) {
        throw CommandError(kFailure, "Wi-Fi settings need root");
    }
}

void RequireAdapter() {
    RequireWifiSettings();
    if (TAVIWirelessConnStatusGet() == WIRELESS_STATUS_NO_ADAPTER) {
        throw CommandError(kFailure, "there is no Wi-Fi adapter: no interface " + WifiInterface());
    }
}

void RequireRadio() {
    const int mayBeUsed = TAVIWirelessCheckBlock();
    if (mayBeUsed == 0) {
        throw CommandError(kFailure,
                           std::string("the radio is switched off: unblock=no is set for this "
                                       "adapter in ") +
                               wireless::kAPSettings);
    }
    if (mayBeUsed < 0) {
        throw CommandError(kFailure, std::string("cannot tell whether the radio may be used: ") +
                                         wireless::kAdapterInfo +
                                         " does not name the adapter, or its section in " +
                                         wireless::kAPSettings + " has no unblock");
    }
}

void RequireNobodyJoins() {
    if (!wireless::FlagFile::IsRaised(wireless::kConnectingFlag)) {
        return;
    }
    const wireless::FlagFile lowered(wireless::kConnectingFlag);
    throw CommandError(kBusy,
                       "a network is being joined already; if that was interrupted, try again");
}

}  // namespace taviwireless::cli
